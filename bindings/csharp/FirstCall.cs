// Mean, modes and a failure.

using System;
using System.Globalization;
using QX;

static class FirstCall
{
    static void Main()
    {
        CultureInfo.CurrentCulture = CultureInfo.InvariantCulture;
        IntPtr x = Host.Array(2, 4, 4, 4, 5, 5, 7, 9), modes = Host.Array();
        double mean, moment;
        int err, order = 0;
        Exports.Mean_head(x, out mean, out err);
        Console.WriteLine("mean {0}", mean);
        err = Exports.ModeH(x, 0, modes);
        Console.WriteLine("modes [{0}] (code {1})", string.Join(", ", Host.Elements(modes)), err);
        Exports.Moment_head(x, ref order, out moment, out err);
        Console.WriteLine("order 0: {0}", Host.ErrorName(err));
        Host.QXHostFree(modes);
        Host.QXHostFree(x);
    }
}
