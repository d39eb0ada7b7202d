/* All the steps of a call: create an array, call an export, read the result, and print the text of a
   failure. The module finds the stand-in host because this program is linked to it.

       cc -std=c11 -Iinclude -Ibuild/release/include examples/first_call.c -Lbuild/release -lqxrt -lqxanalysis */

#include "qx/host.h"
#include "qx/qx.h"

#include <stdio.h>

static double moment(DBL1D x, int32_t order) {
    DBL value;
    ErrorCode err;
    Moment_head(x, &order, &value, &err);
    if (err < 0)
        printf("  %s (%s, %d)\n", QXHostErrorText(err), QXHostErrorName(err), (int)err);
    return value;
}

int main(void) {
    const double samples[] = {2, 4, 4, 4, 5, 5, 7, 9};
    const DBL1D x = QXHostCopy1D(QXTypeDBL, 8, samples);
    const DBL1D modes = QXHostNew1D(QXTypeDBL, 0);
    if (x == NULL || modes == NULL)
        return 1;

    DBL mean;
    ErrorCode err;
    Mean_head(x, &mean, &err);
    printf("mean      %g\n", mean);
    printf("variance  %g\n", moment(x, 2));

    /* An output is also an array; the export resizes it as needed. */
    err = ModeH(x, 0, modes);
    printf("modes    ");
    for (int32_t i = 0; i < (*modes)->dimSize; ++i)
        printf(" %g", ((DBL *)QXHostElements1D(modes))[i]);
    printf("  (code %d)\n", (int)err);

    printf("a moment of order 0:\n");
    printf("  the value is %g\n", moment(x, 0));

    QXHostFree(modes);
    QXHostFree(x);
    return 0;
}
