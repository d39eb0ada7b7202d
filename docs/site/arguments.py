"""Descriptions of arguments that the texts of the headers do not name, by family and name."""

TEXTS = {
    "anova": {
        "chiSquare": "The statistic.",
        "denominatorDegrees": "The degrees of freedom of the denominator of each f.",
        "labelsC": "The level of each observation in the third factor.",
        "levelsC": "The number of levels of the third factor.",
        "sumsOfSquares": "The sum of squares of each source.", "meanSquares": "The mean square of each source.",
        "ssBetween": "The sum of squares between levels.", "msBetween": "The mean square between levels.",
        "ssError": "The sum of squares within levels.", "msError": "The mean square within levels.",
        "ssTotal": "The sum of squares about the overall mean."},
    "bounded_fits": {"a": "The first parameter of the model.",
                     "meanAbsResidual": "The mean of the absolute residuals."},
    "coordinates": {
        **{f"angle{i}": f"The {word} Euler angle, in radians." for i, word in enumerate(("first", "second", "third"), 1)},
        **{word: f"The {word} coordinates of the points." for word in ("first", "second", "third")},
        **{f"new{word}": f"The {word.lower()} coordinates of the converted points."
           for word in ("First", "Second", "Third")},
        **{f"new{axis}": f"The {axis.lower()} coordinates of the rotated points." for axis in "XYZ"}},
    "dct_dst": {"cols": "The number of columns.", "out": "The transformed matrix."},
    "decimation": {"alternate": "Not 0 for unit gain at half the sampling rate, not at 0.", "y": "The result."},
    "eigenproblems": {"values": "The eigenvalues."},
    "fft": {"out": "The transform."},
    "fft2d": {"out": "The transform."},
    "filtering": {"xState": "The state of the input, the samples before this block.",
                  "yState": "The state of the output, the results before this block."},
    "fir_design": {"design": "The design of both stages."},
    "generalised_problems": {"vectors": "The eigenvectors, one to a column."},
    "iir_design": {"gain": "The factor of the product of z - zeros[k] over that of z - poles[k]."},
    "interpolation": {
        "firstSlope": "The slope at the first point.", "lastSlope": "The slope at the last point.",
        "secondDerivatives": "The second derivatives at the points.", "x": "Where the samples are.",
        "y": "The samples.", "yi": "The interpolated value."},
    "linear_fits": {"mse": "The mean squared error."},
    "linear_systems": {
        "a": "The matrix of the system.", "lower": "The diagonal below the main one, of the factors.",
        "upper": "The diagonal above the main one, of the factors.",
        "upper2": "The second diagonal above the main one, of the factors.",
        "tolerance": "Singular values up to this fraction of the largest one count as 0.", "x": "The solution."},
    "matrix_factorisations": {"a": "The packed triangle."},
    "model_fits": {
        "a": "The factor of the model.",
        "mse": "The mean squared error.",
        "w": "The weights of the samples."},
    "noise": {"cache": "What is kept between calls; all 0 before the first.", "x": "The numbers."},
    "peaks": {"request": "The block, what to look for, and what is found."},
    "polynomial_roots": {
        "bairstowMaxIterations": "The limit of Bairstow's iterations.",
        "bairstowTolerance": "Where Bairstow's iterations end.",
        "newtonMaxIterations": "The limit of Newton's iterations.",
        "newtonTolerance": "Where Newton's iterations end.",
        "realGuesses": "Starting values of real roots.", "complexGuesses": "Starting values of complex roots."},
    "pulses": {
        "high": "The upper state.", "highRef": "The upper reference level.", "midRef": "The middle reference level.",
        "lowRef": "The lower reference level.", "hist": "The method for the levels of the states, and the bins.",
        "ref": "The reference levels, as numbers or in percent of the amplitude.",
        "preUndershoot": "The undershoot before the transition.", "preOvershoot": "The overshoot before the transition.",
        "postUndershoot": "The undershoot after the transition.",
        "postOvershoot": "The overshoot after the transition."},
    "rational_resampling": {"x": "The samples."},
    "resampling": {"design": "The spacing or the times of the outputs, and the table of the kernel."},
    "scaling": {"a": "The factor."},
    "special_bessel": {"ai": "Ai(x).", "aip": "Ai'(x).", "bi": "Bi(x).", "bip": "Bi'(x)."},
    "special_integrals": {"c": "The cosine integral C(x)."},
    "special_matrices": {"a": "The packed matrix."},
    "waveforms": {"amp": "The amplitude."},
    "window_constants": {"param": "The parameter of the windows that have one."},
    "windows": {"param": "The parameter of the windows that have one."},
    "zero_phase": {
        **{f"{kind}{way}": f"The state of the {what} of the pass {to}."
           for kind, what in (("state", "sections"), ("xState", "input"), ("yState", "output"))
           for way, to in (("Forward", "forwards"), ("Backward", "backwards"))}},
}
