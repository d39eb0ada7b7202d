using System;
using System.Runtime.InteropServices;

namespace QX
{
    /// <summary>The stand-in host: it creates the arrays of the exports and provides the texts of the codes.</summary>
    public static class Host
    {
        public const int I32 = 3, U8 = 5, U32 = 7, SGL = 9, DBL = 10, CSG = 12, CDB = 13;

        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        public static extern IntPtr QXHostNew1D(int typeCode, int count);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        public static extern IntPtr QXHostNew2D(int typeCode, int rows, int cols);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        public static extern IntPtr QXHostCopy1D(int typeCode, int count, double[] elements);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        public static extern IntPtr QXHostCopy2D(int typeCode, int rows, int cols, double[] elements);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        public static extern void QXHostFree(IntPtr handle);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        public static extern int QXHostReleaseObject(IntPtr word);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        static extern IntPtr QXHostErrorName(int code);
        [DllImport("qxrt", CallingConvention = CallingConvention.Cdecl)]
        static extern IntPtr QXHostErrorText(int code);

        public static string ErrorName(int code) { return Marshal.PtrToStringAnsi(QXHostErrorName(code)); }
        public static string ErrorText(int code) { return Marshal.PtrToStringAnsi(QXHostErrorText(code)); }

        /// <summary>An array of numbers, to be freed by QXHostFree.</summary>
        public static IntPtr Array(params double[] values)
        {
            IntPtr handle = QXHostCopy1D(DBL, values.Length, values);
            if (handle == IntPtr.Zero)
                throw new OutOfMemoryException();
            return handle;
        }

        /// <summary>The elements of a one-dimensional array of numbers.</summary>
        public static double[] Elements(IntPtr handle)
        {
            IntPtr block = Marshal.ReadIntPtr(handle);
            var values = new double[Marshal.ReadInt32(block)];
            Marshal.Copy(block + 4, values, 0, values.Length);
            return values;
        }
    }
}
