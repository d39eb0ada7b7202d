#include "qx/host.h"

namespace {

struct Message {
    int32_t code;
    const char *name;
    const char *text;
};

#define QX_MESSAGE(name, text)                                                                     \
    { name, #name, text }

// In the order of errors.h.
constexpr Message messages[] = {
    {0, "Success", "No error."},
    {QXHostBadArgument, "HostBadArgument",
     "The host was asked for an array that cannot exist: a negative size or an unknown type."},
    {QXHostNoMemory, "HostNoMemory", "The host has no memory for an array of this size."},

    QX_MESSAGE(ErrOutOfMemory, "There is not enough memory for this operation."),
    QX_MESSAGE(ErrSizeMismatch, "The sizes of the input arrays do not match."),
    QX_MESSAGE(ErrEmptyInput,
               "An input array is empty; at least one element is needed in each dimension."),
    QX_MESSAGE(ErrNegativeDimension, "The size of a matrix or vector is negative."),
    QX_MESSAGE(ErrCountNotPositive, "The number of samples must be at least 1."),
    QX_MESSAGE(ErrFewerThanTwo, "At least 2 elements or samples are needed."),
    QX_MESSAGE(ErrFewerThanThree, "At least 3 elements or samples are needed."),
    QX_MESSAGE(ErrSizesDisagree,
               "The sizes of the arguments do not fit together, or an array is too short."),
    QX_MESSAGE(ErrLengthTooLarge, "A length is larger than this operation can handle."),
    QX_MESSAGE(ErrWaveParameterNotPositive, "The duty cycle must be greater than 0."),
    QX_MESSAGE(
        ErrWaveParameterRange,
        "The number of cycles must be greater than 0 and at most half the number of samples."),
    QX_MESSAGE(ErrWidthOutOfRange, "The width is below 1 or too large for the number of samples."),
    QX_MESSAGE(ErrPulseOutOfRange,
               "The pulse's delay and width must not be negative, and together they must fit into "
               "the number of samples."),
    QX_MESSAGE(ErrSamplingNotPositive, "The sampling interval or rate must be greater than 0."),
    QX_MESSAGE(ErrIndexOutOfRange, "An index, an offset or a position is out of range."),
    QX_MESSAGE(ErrBoundsCrossed, "An upper bound lies below its lower bound."),
    QX_MESSAGE(ErrAboveNyquist, "A filter frequency must be below half the sampling rate."),
    QX_MESSAGE(ErrOrderNotPositive,
               "The order, degree or number of taps is out of range; it must be at least 1."),
    QX_MESSAGE(ErrDecimationOutOfRange,
               "The decimation factor must be at least 1 and at most the number of samples."),
    QX_MESSAGE(ErrBadCutoff,
               "Filter frequencies and the sampling rate must be greater than 0, and the band "
               "edges must be in ascending order, up to half the sampling rate."),
    QX_MESSAGE(ErrRippleNotPositive, "The ripple must be greater than 0 decibels."),
    QX_MESSAGE(ErrAttenuationNotPositive, "The attenuation must be greater than 0 decibels."),
    QX_MESSAGE(ErrFitStartValues,
               "The fit has no usable start values: the width to start from is 0, or none can be "
               "formed from the data."),
    QX_MESSAGE(ErrFinalValueNotPositive, "The final value must be greater than 0."),
    QX_MESSAGE(ErrRippleAboveAttenuation, "The ripple must be less than the attenuation."),
    QX_MESSAGE(ErrBadDesignField,
               "The equiripple design has a band, a weight or a number of taps out of range."),
    QX_MESSAGE(ErrNegativeCount, "A count is negative."),
    QX_MESSAGE(ErrBadTapCount,
               "This type of filter does not allow this number of taps: it must be positive, and "
               "even or odd as the type requires."),
    QX_MESSAGE(ErrMixedSigns, "The values have mixed or wrong signs, or one of them is 0."),
    QX_MESSAGE(ErrPolynomialOrderTooHigh,
               "There are too few points for the order or the number of terms; use a lower order "
               "or more points."),
    QX_MESSAGE(ErrInnerDimensionMismatch,
               "The matrices cannot be multiplied: the first must have as many columns as the "
               "second has rows."),
    QX_MESSAGE(ErrNotSquare, "The matrix must be square."),
    QX_MESSAGE(ErrSingularMatrix, "The matrix is singular; the system has no unique solution."),
    QX_MESSAGE(ErrAnovaFewLevels, "Analysis of variance: each factor needs at least 2 levels."),
    QX_MESSAGE(ErrAnovaFactorEmpty,
               "Analysis of variance: the number of different levels in the data is not the "
               "stated number."),
    QX_MESSAGE(ErrAnovaNoReplication,
               "Analysis of variance: each level and each cell needs at least 1 observation."),
    QX_MESSAGE(ErrAnovaCountMismatch,
               "Analysis of variance: the number of observations must be the product of the levels "
               "and the observations per cell."),
    QX_MESSAGE(ErrOverflow, "The result is too large to be represented."),
    QX_MESSAGE(ErrAnovaCellCount,
               "Analysis of variance: the cells do not all have the stated number of "
               "observations."),
    QX_MESSAGE(ErrAnovaNegativeSelector,
               "Analysis of variance: with one observation per cell both factors must be fixed; "
               "random effects need replication."),
    QX_MESSAGE(ErrAbscissaeOrder, "The x values or knots are equal or not in ascending order."),
    QX_MESSAGE(ErrDuplicateAbscissa,
               "Two x values are equal, or the interpolating function has a pole."),
    QX_MESSAGE(ErrTooFewForParameters,
               "The degrees of freedom must be greater than 0, or there are too few points for "
               "the number of parameters."),
    QX_MESSAGE(ErrProbabilityOutOfRange,
               "A probability or confidence level must lie between 0 and 1."),
    QX_MESSAGE(ErrTableTooSmall, "The table needs at least 2 rows and 2 columns."),
    QX_MESSAGE(ErrTableNegativeSize, "The size of the table or one of its counts is negative."),
    QX_MESSAGE(ErrStateSizeMismatch,
               "The state array does not have the length that this filter needs; reset the state "
               "first."),
    QX_MESSAGE(ErrNegativeSetting,
               "A setting that must not be negative is negative or not a number."),
    QX_MESSAGE(ErrDegenerateValue,
               "The computation cannot proceed because a value it depends on, such as a norm, a "
               "pole or an eigenvalue, is zero or cannot be used."),
    QX_MESSAGE(ErrInvalidSelector, "A selector is not one of its permitted values."),
    QX_MESSAGE(ErrIterationLimit,
               "The iteration reached its limit before it converged; results may be inaccurate."),
    QX_MESSAGE(ErrBadCoefficients,
               "The coefficients are not finite or lack a property that the operation requires, "
               "or a count is below 1."),
    QX_MESSAGE(ErrNoUsableFit,
               "No attempt at a fit gave a usable result, or there was nothing to start from."),
    QX_MESSAGE(ErrCoefficientSizes,
               "The sizes of the filter's coefficient arrays do not fit its order or number of "
               "stages."),
    QX_MESSAGE(ErrNonFiniteInput, "A value is infinite or not a number."),
    QX_MESSAGE(ErrTooFewForGaussian, "A Gaussian fit needs at least 4 points."),
    QX_MESSAGE(ErrBandVectorSize,
               "The sizes of the band matrix and the vector, or of the two matrices, do not fit "
               "together."),
    QX_MESSAGE(ErrNotPositiveDefinite, "The matrix is not positive definite."),
    QX_MESSAGE(ErrConditionTooHigh,
               "The problem is too badly conditioned for a meaningful solution."),
    QX_MESSAGE(ErrSolverCount,
               "The eigenvalues were found, but rounding changed their order afterwards."),
    QX_MESSAGE(ErrBufferOverrun,
               "A position in the stream is not finite or would pass the end of its buffer."),
    QX_MESSAGE(ErrIndexNotBelowSize,
               "An index into the stream is not below its size, or the output array is too short."),
    QX_MESSAGE(ErrNotAvailable,
               "The function is not available, has no result for these arguments, or was ended "
               "by a procedure of the caller."),
    QX_MESSAGE(ErrRangeReversed, "The lower end of a range is above its upper end."),
    QX_MESSAGE(ErrPolynomialOrderNegative, "The order of the polynomial is negative."),
    QX_MESSAGE(ErrNaNInData,
               "The data, a bound or a value computed from them is NaN (not a number)."),
    QX_MESSAGE(ErrBadSignificance, "The significance level must lie between 0 and 1."),
    QX_MESSAGE(ErrAllCoefficientsZero, "All coefficients of the polynomial are zero."),
    QX_MESSAGE(ErrFFTSizeNotPositive, "The size of the transform must be at least 1."),
    QX_MESSAGE(ErrNonFiniteFunction, "The function has a value that is infinite or not a number."),
    QX_MESSAGE(ErrBesselStatusFour,
               "The result has no significant digit left: the argument or the order is too large "
               "in magnitude."),
    QX_MESSAGE(ErrWorkspaceAlreadyInitialized, "The analysis workspace is already reserved."),
    QX_MESSAGE(ErrWorkspaceStillEnabled,
               "The analysis workspace is still enabled; disable it before releasing it."),
    QX_MESSAGE(ErrWorkspaceNotInitialized, "The analysis workspace has not been reserved."),
    QX_MESSAGE(ErrWorkspaceStillInUse,
               "The analysis workspace is still in use by an operation and cannot be released."),
    QX_MESSAGE(ErrWorkspaceWrongThread, "The analysis workspace belongs to another thread."),
    QX_MESSAGE(ErrWorkspaceExhausted, "The analysis workspace is too small for this operation."),
    QX_MESSAGE(ErrFitPointsTooFew, "The fit has fewer points than free parameters."),
    QX_MESSAGE(ErrNotStrictlyPositive, "A value that must be greater than 0 is not."),
    QX_MESSAGE(
        ErrTooFewWeights,
        "Too few weights differ from zero for this fit, or a value that must not be 0 is 0."),
    QX_MESSAGE(ErrAnovaDesign,
               "Analysis of variance: the data do not allow the tests of the chosen design."),
    QX_MESSAGE(ErrInternal,
               "Two outputs are the same array, a plan slot or state holds something else, or an "
               "internal check of the library failed."),
    QX_MESSAGE(ErrBesselStatusOne, "The arguments of the Bessel function are not allowed."),
    QX_MESSAGE(ErrMultirateStateSize,
               "The state does not have the size that this multirate filter needs; call it once "
               "with a reset."),
    QX_MESSAGE(ErrMultirateBuffer,
               "The multirate filter has no working memory, or its input and output are the same "
               "array."),

    QX_MESSAGE(ErrMeasureSearchShort,
               "The waveform has too few level crossings for this measurement."),
    QX_MESSAGE(ErrMeasureNotPositive,
               "The measured amplitude or period is not greater than 0, or not finite."),
    QX_MESSAGE(ErrMeasureTooFewPoints,
               "The waveform has too few points or too few transitions for this measurement."),
    QX_MESSAGE(ErrMeasureOutOfMemory, "There is not enough memory for the measurement."),
    QX_MESSAGE(ErrMeasureEmpty, "The waveform is empty."),
    QX_MESSAGE(ErrMeasureRangeReversed,
               "The lower end of a range, or the low reference level, must be below the upper "
               "one."),
    QX_MESSAGE(ErrMeasureLevelsReversed,
               "The sampling interval of the waveform must be greater than 0."),
    QX_MESSAGE(ErrMeasureTooManyChannels,
               "The method of the measurement is unknown, or there are more than 2 channels."),
    QX_MESSAGE(ErrMeasureEmptyChannel, "The number of histogram bins must be at least 1."),
    QX_MESSAGE(ErrMeasureNotFound, "The quantity to be measured was not found in the waveform."),
    QX_MESSAGE(ErrMeasureBadCount,
               "A number of peaks, tones, harmonics, pulses, transitions or cycles must be at "
               "least 1."),
    QX_MESSAGE(ErrMeasureOutOfRange, "A measured duration is not greater than 0."),
    QX_MESSAGE(ErrMeasureNullState,
               "A pointer to the state or to a result of the measurement is null."),

    QX_MESSAGE(WarnRankDeficient,
               "The system does not have full rank; one of many solutions was chosen."),
    QX_MESSAGE(WarnEmptyResult, "The input is empty, and so is the result."),
    QX_MESSAGE(WarnSingular, "The matrix is singular to working precision."),
    QX_MESSAGE(WarnLengthsDiffer,
               "The arrays have different lengths; only the length of the shorter one was used."),
    QX_MESSAGE(WarnNegativeEstimate, "An estimate that should be positive came out negative."),
    QX_MESSAGE(WarnLowAccuracy, "The result may have lost many of its significant digits."),
    QX_MESSAGE(WarnFitIncomplete,
               "The guess or the bounds have the wrong length; an array that is too short was "
               "not used."),
    QX_MESSAGE(WarnMeasurePartial,
               "A state level is uncertain: its histogram bin holds few samples."),
    QX_MESSAGE(WarnFitCoefficientsNonFinite,
               "The start coefficients were not finite; the fit chose its own."),
    QX_MESSAGE(WarnPolynomialOrderCapped, "The order of the polynomial was reduced to 25."),
    QX_MESSAGE(WarnMultirateEmpty, "The multirate filter was called without input."),
};

constexpr Message unknown = {0, "Unknown", "There is no text for this code."};

const Message &Find(int32_t code) {
    for (const Message &message : messages)
        if (message.code == code)
            return message;
    return unknown;
}

} // namespace

const char *QXHostErrorText(ErrorCode code) { return Find(code).text; }
const char *QXHostErrorName(ErrorCode code) { return Find(code).name; }
