#ifndef QX_ERRORS_H
#define QX_ERRORS_H

/* Every code that an export can return, apart from a status of the host, which is passed on
   unchanged. The numbers are a fixed interface and never change; the message texts belong to the
   host. */

enum QXErrorCode {
    QXSuccess = 0,

    /* Failures. */
    /* An allocation failed, or the host refused a resize (HostBlockReshape). */
    ErrOutOfMemory = -20001,
    /* Input arrays whose sizes must match do not: x and y data, data and weights, a vector and the
       rows of a matrix. */
    ErrSizeMismatch = -20002,
    /* An input array has no element, or a matrix has a dimension below 1. */
    ErrEmptyInput = -20003,
    /* A matrix or vector size is below 0; also a negative size passed to an inner routine. */
    ErrNegativeDimension = -20004,
    /* A requested number of samples is below 1. */
    ErrCountNotPositive = -20005,
    /* An array has fewer than 2 elements, or a sample count is below 2, where 2 are needed. */
    ErrFewerThanTwo = -20006,
    /* An array has fewer than 3 elements, or a sample count is below 3, where 3 are needed
       (tridiagonal systems, 3-D integration). */
    ErrFewerThanThree = -20007,
    /* The arrays of one operation disagree in shape: coordinate arrays of unequal length, a
       rotation matrix that is not 3 by 3, bands of unequal length. Also an array that is too short
       for the operation. */
    ErrSizesDisagree = -20008,
    /* A length exceeds what the routine accepts: more than 8388608 values in Deconvolution, a
       result of more than 2^31 - 1 elements, an index of the DZT band transform beyond int32_t. */
    ErrLengthTooLarge = -20010,
    /* The duty cycle of a square wave is 0 or less. */
    ErrWaveParameterNotPositive = -20011,
    /* The number of cycles is 0 or less, or above half the sample count. */
    ErrWaveParameterRange = -20012,
    /* A width is below 1 or too large for the number of samples. */
    ErrWidthOutOfRange = -20013,
    /* The delay or the width of a pulse is negative, or their sum exceeds the sample count. */
    ErrPulseOutOfRange = -20014,
    /* A sampling interval or rate is 0 or less. */
    ErrSamplingNotPositive = -20016,
    /* A start index, an offset, a position or a pivot is out of range. */
    ErrIndexOutOfRange = -20017,
    /* An upper bound lies below its lower bound. */
    ErrBoundsCrossed = -20019,
    /* A filter frequency is not below half the sampling rate. */
    ErrAboveNyquist = -20020,
    /* An order, a degree or a number of taps is out of range, usually 0 or less. */
    ErrOrderNotPositive = -20021,
    /* A decimation factor is below 1 or above the sample count. */
    ErrDecimationOutOfRange = -20022,
    /* A filter frequency or the sampling rate is 0 or less, or the band edges are out of
       order. */
    ErrBadCutoff = -20023,
    /* A ripple is 0 or less. */
    ErrRippleNotPositive = -20024,
    /* An attenuation is 0 or less. */
    ErrAttenuationNotPositive = -20025,
    /* The start values of the fit of a peak cannot be formed: the deviation is 0, or points are
       missing. */
    ErrFitStartValues = -20026,
    /* The final value of a decay is not above 0. */
    ErrFinalValueNotPositive = -20027,
    /* A ripple is not below its attenuation. */
    ErrRippleAboveAttenuation = -20028,
    /* Equiripple design: a field of the design, such as a band or the tap count, is out of
       range. */
    ErrBadDesignField = -20031,
    /* A count argument, such as an order or a rank, is below 0. */
    ErrNegativeCount = -20032,
    /* The number of taps has the wrong parity or sign for the type of filter. */
    ErrBadTapCount = -20033,
    /* Values have mixed or wrong signs: they must be all positive or, for some fits, all
       negative. */
    ErrMixedSigns = -20036,
    /* There are too few points for the order or the number of terms of a fit. */
    ErrPolynomialOrderTooHigh = -20037,
    /* The operands of a matrix product do not conform. */
    ErrInnerDimensionMismatch = -20039,
    /* A matrix that must be square is not. */
    ErrNotSquare = -20040,
    /* A matrix is singular. */
    ErrSingularMatrix = -20041,
    /* ANOVA: a factor has fewer than 2 levels. */
    ErrAnovaFewLevels = -20042,
    /* ANOVA: the number of different levels in the data is not the stated number. */
    ErrAnovaFactorEmpty = -20043,
    /* ANOVA: the number of observations in a level or per cell is below 1. */
    ErrAnovaNoReplication = -20044,
    /* ANOVA: the data count is not the product of levels and replications. */
    ErrAnovaCountMismatch = -20045,
    /* A result would overflow; or, in the resampling routines, a product of sizes overflows or the
       end of a stream does not fit into its buffer. */
    ErrOverflow = -20046,
    /* ANOVA: the number of observations in a cell differs from the stated one. */
    ErrAnovaCellCount = -20047,
    /* ANOVA: a random factor (its selector is below 0) with only one observation per cell. */
    ErrAnovaNegativeSelector = -20048,
    /* Abscissae or knots are equal or not in ascending order. */
    ErrAbscissaeOrder = -20049,
    /* Two abscissae are equal, or an interpolating function has a pole. */
    ErrDuplicateAbscissa = -20050,
    /* There are fewer points than parameters, or the degrees of freedom are below 1. */
    ErrTooFewForParameters = -20052,
    /* A probability or confidence level is outside the range from 0 to 1. */
    ErrProbabilityOutOfRange = -20053,
    /* A contingency table or design has a dimension below 2. */
    ErrTableTooSmall = -20055,
    /* A contingency table has a negative dimension. */
    ErrTableNegativeSize = -20056,
    /* The state array of a streaming filter has the wrong length. */
    ErrStateSizeMismatch = -20058,
    /* A setting that must not be negative is: an offset, a start, a delay, a hysteresis. */
    ErrNegativeSetting = -20059,
    /* A computation cannot proceed: a zero pole, a zero norm, the logarithm of a zero eigenvalue or
       diagonal element, or another value that cannot be used. */
    ErrDegenerateValue = -20060,
    /* An enumerated argument is not one of its values. */
    ErrInvalidSelector = -20061,
    /* An iteration reached its limit. Several exports keep their results with this code. */
    ErrIterationLimit = -20062,
    /* Coefficients are not finite or lack a required property (the conjugate of a root, the
       orthogonality of a rotation matrix), or an order or count is below 1. */
    ErrBadCoefficients = -20063,
    /* No candidate fit gave a usable result, or there was nothing to start from. */
    ErrNoUsableFit = -20064,
    /* The sizes of a filter's coefficient arrays disagree with its stage count or order. */
    ErrCoefficientSizes = -20066,
    /* An input or intermediate value is not finite. */
    ErrNonFiniteInput = -20068,
    /* A Gaussian fit has fewer than 4 points. */
    ErrTooFewForGaussian = -20069,
    /* A band matrix and its vector, or the matrices of a generalised problem, disagree in
       size. */
    ErrBandVectorSize = -20070,
    /* A pivot of a Cholesky factorisation is 0 or less. */
    ErrNotPositiveDefinite = -20071,
    /* The eigenvectors of a matrix are too nearly dependent, or an eigenvalue solver failed for a
       reason other than convergence. */
    ErrConditionTooHigh = -20073,
    /* Rounding changed eigenvalues while they were being ordered. */
    ErrSolverCount = -20074,
    /* A position in a stream is not finite or would pass the end of its buffer. */
    ErrBufferOverrun = -20075,
    /* A stream index is not below its size, or an output array is too short. */
    ErrIndexNotBelowSize = -20076,
    /* The function is not available and always fails after its checks, it has no result for its
       arguments, or a procedure of the caller ended it. */
    ErrNotAvailable = -20078,
    /* A range's lower end is above its upper end. */
    ErrRangeReversed = -20101,
    /* A polynomial order is below 0. */
    ErrPolynomialOrderNegative = -20103,
    /* The data of a statistic, a bound, or a value computed from the data is NaN. */
    ErrNaNInData = -20104,
    /* A significance level is outside the range from 0 to 1. */
    ErrBadSignificance = -20105,
    /* A polynomial has no non-zero coefficient left. */
    ErrAllCoefficientsZero = -20111,
    /* A requested transform size is below 1. */
    ErrFFTSizeNotPositive = -20115,
    /* An evaluated function value is not finite. */
    ErrNonFiniteFunction = -20116,
    /* Complex Bessel functions: no significant digit is left; the argument or the order is too
       large. */
    ErrBesselStatusFour = -20117,
    /* The workspace is to be reserved, but a region already exists. */
    ErrWorkspaceAlreadyInitialized = -20120,
    /* The workspace is to be released while it is enabled. */
    ErrWorkspaceStillEnabled = -20121,
    /* The workspace is to be enabled or disabled, but no region exists. */
    ErrWorkspaceNotInitialized = -20122,
    /* The workspace is to be released while blocks in it are in use. */
    ErrWorkspaceStillInUse = -20123,
    /* Internal: the calling thread does not own the workspace. */
    ErrWorkspaceWrongThread = -20124,
    /* Internal: a request does not fit into the region. */
    ErrWorkspaceExhausted = -20126,
    /* A fit has fewer points than free parameters. */
    ErrFitPointsTooFew = -20127,
    /* A value that must be greater than 0 is not: data of a logarithmic or power fit, a factor, a
       frequency, a scale. */
    ErrNotStrictlyPositive = -20140,
    /* Too few non-zero weights remain for the fit, or a value that must not be 0 is 0. */
    ErrTooFewWeights = -20141,
    /* ANOVA: a denominator of the tests of the chosen design is not above 0. */
    ErrAnovaDesign = -20166,
    /* Two outputs are the same array, a slot or instance word holds something of another kind, or
       an internal consistency check failed. */
    ErrInternal = -20999,
    /* Complex Bessel functions: the arguments are outside the domain or not finite. */
    ErrBesselStatusOne = -23039,
    /* A streaming multirate export was called without a reset, and its state does not have the size
       that it needs. */
    ErrMultirateStateSize = -24034,
    /* A multirate routine could not get scratch memory, or its input and output are the same
       buffer. */
    ErrMultirateBuffer = -24051,

    /* Failures of waveform measurements. */
    /* The waveform has too few level crossings. */
    ErrMeasureSearchShort = -20308,
    /* A measured amplitude or period is not above 0, or not finite. */
    ErrMeasureNotPositive = -20309,
    /* The waveform has too few transitions or points. */
    ErrMeasureTooFewPoints = -20310,
    /* A measurement routine could not get its working memory. */
    ErrMeasureOutOfMemory = -20311,
    /* The waveform is empty. */
    ErrMeasureEmpty = -20312,
    /* The lower end of a range, or the low reference level, is not below the upper one. */
    ErrMeasureRangeReversed = -20313,
    /* The sampling interval of a waveform is not above 0. */
    ErrMeasureLevelsReversed = -20315,
    /* The method of a measurement is unknown, or a measurement matrix has more than 2 rows. */
    ErrMeasureTooManyChannels = -20316,
    /* The number of histogram bins is below 1, or a channel has no samples. */
    ErrMeasureEmptyChannel = -20317,
    /* The quantity to be measured was not found. */
    ErrMeasureNotFound = -20319,
    /* A number of peaks, tones, harmonics, pulses, transitions or cycles is below 1. */
    ErrMeasureBadCount = -20323,
    /* A measured duration is not above 0. */
    ErrMeasureOutOfRange = -20326,
    /* A pointer to the state or to a result of a measurement is null. */
    ErrMeasureNullState = -20331,

    /* Warnings. */
    /* The system does not have full rank. Some exports report success instead. */
    WarnRankDeficient = 20001,
    /* The input is empty, and so is the result. */
    WarnEmptyResult = 20002,
    /* The matrix is singular to working precision; the results are complete. */
    WarnSingular = 20003,
    /* Two arrays have different lengths; only the length of the shorter one is used. */
    WarnLengthsDiffer = 20004,
    /* An estimate that should be positive came out negative. */
    WarnNegativeEstimate = 20005,
    /* The result may have lost half of its significant digits or more. */
    WarnLowAccuracy = 20006,
    /* The guess or the bounds of a fit have the wrong length; an array that is too short is not
       used. */
    WarnFitIncomplete = 20010,
    /* A state level is uncertain: its histogram bin holds few samples. */
    WarnMeasurePartial = 20021,
    /* The given start coefficients were not finite, and the routine chose its own. */
    WarnFitCoefficientsNonFinite = 20030,
    /* A polynomial order above 25 was capped. */
    WarnPolynomialOrderCapped = 20031,
    /* A multirate stream call had no input. */
    WarnMultirateEmpty = 24003,
};

#endif
