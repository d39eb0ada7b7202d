/* The functions that compiled Fortran requires of its run-time and of the mathematics library, so
   that the module needs no Fortran run-time and takes no mathematics from the process. */

#include <math.h>
#include <stddef.h>
#include <string.h>

/* The result may be longer than both strings together and is then padded. */
void _gfortran_concat_string(size_t length, char *result, size_t firstLength, const char *first,
                             size_t secondLength, const char *second) {
    const size_t fromFirst = firstLength < length ? firstLength : length;
    const size_t room = length - fromFirst;
    const size_t fromSecond = secondLength < room ? secondLength : room;
    memcpy(result, first, fromFirst);
    memcpy(result + fromFirst, second, fromSecond);
    memset(result + fromFirst + fromSecond, ' ', room - fromSecond);
}

double cabs(double _Complex z) { return hypot(__real__ z, __imag__ z); }

/* The principal root: first the part without cancellation, then the other from their product. */
double _Complex csqrt(double _Complex z) {
    const double re = __real__ z, im = __imag__ z;
    double _Complex root = 0.0;
    if (re == 0.0 && im == 0.0)
        return root;
    const double large = sqrt(0.5 * hypot(re, im) + 0.5 * fabs(re));
    const double small = 0.5 * fabs(im) / large;
    __real__ root = re >= 0.0 ? large : small;
    __imag__ root = copysign(re >= 0.0 ? small : large, im);
    return root;
}

/* Rounds halves away from zero. lroundf must not call lround: the compiler knows that lround of a
   float is lroundf, and would make lroundf call itself for ever. */
static long Nearest(double x) { return (long)(x < 0.0 ? ceil(x - 0.5) : floor(x + 0.5)); }
long lround(double x) { return Nearest(x); }
long lroundf(float x) { return Nearest((double)x); }
float logf(float x) { return (float)log((double)x); }

/* x^n. The function of the compiler's run-time would come from the process. */
double __powidf2(double x, int n) {
    unsigned left = n < 0 ? 0u - (unsigned)n : (unsigned)n;
    double power = left % 2 != 0 ? x : 1.0;
    while ((left >>= 1) != 0) {
        x *= x;
        if (left % 2 != 0)
            power *= x;
    }
    return n < 0 ? 1.0 / power : power;
}

/* BLAS and LAPACK report a bad argument here, which none of our calls has. The process belongs to
   the host: nothing is printed, and the process is not stopped. */
void xerbla_(const char *name, const int *argument, size_t nameLength) {
    (void)name;
    (void)argument;
    (void)nameLength;
}
