#ifndef QX_ERRORS_H
#define QX_ERRORS_H

/* Every code that an export can return, apart from a host status passed on untranslated. The
   numbers are a fixed interface and never change; the texts belong to the host. */

enum QXErrorCode {
    QXSuccess = 0,

    /* Failures. */
    /* An allocation or HostBlockReshape fails. The most frequent code. */
    ErrOutOfMemory = -20001,
    /* Two input arrays that must have equal length differ: x and y data, weights, a vector
       against a matrix's rows. */
    ErrSizeMismatch = -20002,
    /* An input array has fewer than 1 element, or a matrix has a dimension below 1. The usual
       first check. */
    ErrEmptyInput = -20003,
    /* A matrix or vector size is below 0; also a negative size passed to an inner routine. */
    ErrNegativeDimension = -20004,
    /* A requested number of samples is below 1. */
    ErrCountNotPositive = -20005,
    /* An array or sample count has fewer than 2 elements where 2 are needed. */
    ErrFewerThanTwo = -20006,
    /* Fewer than 3 where 3 are needed (tridiagonal systems, 3-D integration, confidence bounds
       with too few points). */
    ErrFewerThanThree = -20007,
    /* Arrays of one operation disagree in shape: coordinate arrays of unequal length, a
       rotation matrix that is not 3 by 3, bands of unequal length. */
    ErrSizesDisagree = -20008,
    /* A length exceeds what the routine can take: Deconvolution above 8388608 values; in the
       DZT band transform an index that has gone below 0. */
    ErrLengthTooLarge = -20010,
    /* The first real waveform parameter of Square is 0 or less. */
    ErrWaveParameterNotPositive = -20011,
    /* A further waveform parameter is 0 or less, or above half the sample count. */
    ErrWaveParameterRange = -20012,
    /* A width is below 1, or the block holds fewer samples than the width. */
    ErrWidthOutOfRange = -20013,
    /* Delay and width of a pulse are negative or together exceed the sample count. */
    ErrPulseOutOfRange = -20014,
    /* A sampling interval or rate is 0 or less. */
    ErrSamplingNotPositive = -20016,
    /* A start index or shift lies outside the array: ReOXFFTH80, 2-D transforms, and design
       routines. */
    ErrIndexOutOfRange = -20017,
    /* An upper bound lies below its lower bound. */
    ErrBoundsCrossed = -20019,
    /* A filter frequency is not below half the sampling rate. */
    ErrAboveNyquist = -20020,
    /* A filter or spline order is 0 or less. */
    ErrOrderNotPositive = -20021,
    /* A decimating factor is below 1 or above the sample count. */
    ErrDecimationOutOfRange = -20022,
    /* A filter frequency or the sampling rate is 0 or less, or the band edges are out of
       order. */
    ErrBadCutoff = -20023,
    /* A ripple is 0 or less. */
    ErrRippleNotPositive = -20024,
    /* An attenuation is 0 or less. */
    ErrAttenuationNotPositive = -20025,
    /* Start values for a Gaussian fit cannot be formed: a needed value is 0 or the points are
       missing. */
    ErrFitStartValues = -20026,
    /* A final or decay value is not above 0. */
    ErrFinalValueNotPositive = -20027,
    /* A ripple is not below its attenuation. */
    ErrRippleAboveAttenuation = -20028,
    /* Equiripple design: a field of the design, such as a band or the tap count, is out of
       range. */
    ErrBadDesignField = -20031,
    /* A count argument is below 0 in a filter-coefficient routine. */
    ErrNegativeCount = -20032,
    /* Tap count has the wrong parity or sign for the filter type. */
    ErrBadTapCount = -20033,
    /* Values that must be all positive or all negative are neither. */
    ErrMixedSigns = -20036,
    /* The number of points is not above the polynomial terms to be fitted. */
    ErrPolynomialOrderTooHigh = -20037,
    /* Matrix product operands do not conform. */
    ErrInnerDimensionMismatch = -20039,
    /* A matrix that must be square is not. */
    ErrNotSquare = -20040,
    /* A matrix is singular (an inner +20003 is mapped to this in many frames). */
    ErrSingularMatrix = -20041,
    /* ANOVA: a factor has fewer than 2 levels. */
    ErrAnovaFewLevels = -20042,
    /* ANOVA: a factor has no level in the data. */
    ErrAnovaFactorEmpty = -20043,
    /* ANOVA: the observations per cell are below 1. */
    ErrAnovaNoReplication = -20044,
    /* ANOVA: the data count is not the product of levels and replications. */
    ErrAnovaCountMismatch = -20045,
    /* A result would overflow: complex Bessel family inner status 2; a size product or a
       stream tail that exceeds its buffer in the resampling routines. */
    ErrOverflow = -20046,
    /* ANOVA: a cell's count differs from the replication count. */
    ErrAnovaCellCount = -20047,
    /* ANOVA: with one observation per cell, a factor selector is below 0. */
    ErrAnovaNegativeSelector = -20048,
    /* Abscissae are not in strictly ascending order. */
    ErrAbscissaeOrder = -20049,
    /* Two neighbouring abscissae are equal. */
    ErrDuplicateAbscissa = -20050,
    /* Fewer points than parameters, or degrees of freedom below 1. */
    ErrTooFewForParameters = -20052,
    /* A probability or confidence level lies outside 0 and 1. */
    ErrProbabilityOutOfRange = -20053,
    /* A contingency table or design has a dimension below 2. */
    ErrTableTooSmall = -20055,
    /* A contingency table has a negative dimension. */
    ErrTableNegativeSize = -20056,
    /* The state array of a streaming filter has the wrong length. */
    ErrStateSizeMismatch = -20058,
    /* A delay, overlap or state setting is below 0. */
    ErrNegativeSetting = -20059,
    /* A computation cannot proceed: a zero pole, a zero norm, the logarithm of a zero
       eigenvalue or diagonal element, or a value of no use. */
    ErrDegenerateValue = -20060,
    /* An enumerated argument is not one of its values. */
    ErrInvalidSelector = -20061,
    /* An iteration reached its limit. Several exports keep their results with this code. */
    ErrIterationLimit = -20062,
    /* A coefficient array contains NaN, or a count of side points is below 1. */
    ErrBadCoefficients = -20063,
    /* No candidate fit gave a usable result. */
    ErrNoUsableFit = -20064,
    /* The sizes of a filter's coefficient arrays disagree with its stage count or order. */
    ErrCoefficientSizes = -20066,
    /* An input or intermediate value is not finite. */
    ErrNonFiniteInput = -20068,
    /* Gaussian fit: fewer than 4 points. */
    ErrTooFewForGaussian = -20069,
    /* A band matrix and its vector, or the matrices of a generalised problem, disagree in
       size. */
    ErrBandVectorSize = -20070,
    /* A pivot of a Cholesky factorisation is 0 or less. */
    ErrNotPositiveDefinite = -20071,
    /* A condition estimate is not finite or above 1e14; also a solver's count that equals the
       order plus 1. */
    ErrConditionTooHigh = -20073,
    /* A solver's count equals the order plus 2. */
    ErrSolverCount = -20074,
    /* A position in a stream would pass the end of its buffer. */
    ErrBufferOverrun = -20075,
    /* A stream index is not below its size. */
    ErrIndexNotBelowSize = -20076,
    /* A routine that always fails after its checks; a function with no result for its
       arguments. */
    ErrNotAvailable = -20078,
    /* A range's lower end is above its upper end. */
    ErrRangeReversed = -20101,
    /* Polynomial order below 0. */
    ErrPolynomialOrderNegative = -20103,
    /* The data contain NaN in a statistic; also the status of a bounded fit that could not
       finish. */
    ErrNaNInData = -20104,
    /* A significance level lies outside 0 and 1. */
    ErrBadSignificance = -20105,
    /* A polynomial has no non-zero coefficient left. */
    ErrAllCoefficientsZero = -20111,
    /* A requested transform size is below 1. */
    ErrFFTSizeNotPositive = -20115,
    /* An evaluated function value is not finite. */
    ErrNonFiniteFunction = -20116,
    /* Complex Bessel family inner status 4. */
    ErrBesselStatusFour = -20117,
    /* A region is reserved while one exists. */
    ErrWorkspaceAlreadyInitialized = -20120,
    /* The region is given back while it is enabled. */
    ErrWorkspaceStillEnabled = -20121,
    /* The region is enabled or disabled but none exists. */
    ErrWorkspaceNotInitialized = -20122,
    /* The region is given back while blocks in it are live. */
    ErrWorkspaceStillInUse = -20123,
    /* Inner: the calling thread does not own the workspace. */
    ErrWorkspaceWrongThread = -20124,
    /* Inner: a request does not fit into the region. */
    ErrWorkspaceExhausted = -20126,
    /* Fewer points than free parameters in a fit. */
    ErrFitPointsTooFew = -20127,
    /* Data of a logarithmic or power fit are not strictly positive; also other demands for
       positive values. */
    ErrNotStrictlyPositive = -20140,
    /* Too few non-zero weights remain for the fit. */
    ErrTooFewWeights = -20141,
    /* ANOVA: the final test of the chosen design failed. */
    ErrAnovaDesign = -20166,
    /* An inner consistency check failed: a plan whose length is not the transform's, an
       impossible state, an inner solver's unknown result. Also two outputs that are one array, and
       a word of a node that holds something of another kind. */
    ErrInternal = -20999,
    /* Complex Bessel family inner status 1. */
    ErrBesselStatusOne = -23039,
    /* A streaming multirate export without a reset found its state of another size than it
       needs. */
    ErrMultirateStateSize = -24034,
    /* A CIC routine got no scratch memory, or its input and output are the same buffer. */
    ErrMultirateBuffer = -24051,

    /* Failures of the waveform measurements. */
    /* A level search ended short of its entries. */
    ErrMeasureSearchShort = -20308,
    /* A measured amplitude or period is 0 or less. */
    ErrMeasureNotPositive = -20309,
    /* Too few transitions or points. */
    ErrMeasureTooFewPoints = -20310,
    /* A measurement routine could not get its working memory. */
    ErrMeasureOutOfMemory = -20311,
    /* Waveform empty. */
    ErrMeasureEmpty = -20312,
    /* A range's lower end is not below its upper end. */
    ErrMeasureRangeReversed = -20313,
    /* Low reference not below high reference. */
    ErrMeasureLevelsReversed = -20315,
    /* A measurement matrix has more than 2 rows. */
    ErrMeasureTooManyChannels = -20316,
    /* A measurement matrix has a channel of no samples. */
    ErrMeasureEmptyChannel = -20317,
    /* Nothing to measure was found. */
    ErrMeasureNotFound = -20319,
    /* A tone or peak count is 0 or less. */
    ErrMeasureBadCount = -20323,
    /* A measured value lies out of its range. */
    ErrMeasureOutOfRange = -20326,
    /* The measurement state or an output pointer is null. */
    ErrMeasureNullState = -20331,

    /* Warnings. */
    /* Rank of a solved system is below full. Several exports turn this into success. */
    WarnRankDeficient = 20001,
    /* Empty input handled with an empty result. */
    WarnEmptyResult = 20002,
    /* An inner LU or similar routine met a singular matrix; frames turn it into -20041 or keep
       it. */
    WarnSingular = 20003,
    /* Two arrays of different length; the value stands for the shorter one. */
    WarnLengthsDiffer = 20004,
    /* An inner routine's estimate came out negative. */
    WarnNegativeEstimate = 20005,
    /* Complex Bessel family inner status 3; also a matrix routine's convergence test at 1e-12. */
    WarnLowAccuracy = 20006,
    /* A fit's inner method finished with a status other than 0 or 2. */
    WarnFitIncomplete = 20010,
    /* Raised and tested inside the measurement routines; returned when no better result
       exists. */
    WarnMeasurePartial = 20021,
    /* Supplied start coefficients were not finite and the routine chose its own. */
    WarnFitCoefficientsNonFinite = 20030,
    /* A polynomial order above 25 was capped. */
    WarnPolynomialOrderCapped = 20031,
    /* A multirate stream call had no input. */
    WarnMultirateEmpty = 24003,
};

#endif
