# shellcheck shell=bash
# The targets: with which compilers, and with which flags for the processor, the libraries that the module
# carries are built. Sourced by library.sh, and part of what their bits rest on.
#   choose_target NAME     sets
#     prefix, fortran      of gcc, ar and nm; the Fortran compiler
#     c_packages, fortran_packages
#     arch                 musl's folder of the target, for types
#     assembly             musl's folder with square root and magnitude as one instruction
#     machine_flags        the processor and the kind of code
TARGETS="linux|arm64|i686-mingw|x86_64-mingw"

choose_target() {
    local intel="-march=x86-64" arm="-march=armv8-a"
    prefix='' assembly=x86_64
    case $1-$(uname -m) in
    linux-x86_64)
        fortran=gfortran c_packages=gcc fortran_packages=gfortran arch=x86_64 machine_flags="$intel -fPIC"
        ;;
    linux-aarch64)
        fortran=gfortran c_packages=gcc fortran_packages=gfortran arch=aarch64 assembly=aarch64
        machine_flags="$arm -fPIC"
        ;;
    linux-*) fail "the processor $(uname -m) is none of those that the library is made for: x86_64, aarch64" ;;
    arm64-*)
        prefix=aarch64-linux-gnu- fortran=aarch64-linux-gnu-gfortran arch=aarch64 assembly=aarch64
        c_packages=g++-aarch64-linux-gnu fortran_packages=gfortran-aarch64-linux-gnu machine_flags="$arm -fPIC"
        ;;
    i686-mingw-*)
        prefix=i686-w64-mingw32- fortran=i686-w64-mingw32-gfortran-win32 arch=i386
        c_packages=g++-mingw-w64-i686-win32 fortran_packages=gfortran-mingw-w64-i686-win32
        machine_flags="-march=i686 -msse2 -mfpmath=sse -mstackrealign"
        ;;
    x86_64-mingw-*)
        prefix=x86_64-w64-mingw32- fortran=x86_64-w64-mingw32-gfortran-win32 arch=x86_64
        c_packages=g++-mingw-w64-x86-64-win32 fortran_packages=gfortran-mingw-w64-x86-64-win32
        machine_flags="$intel"
        ;;
    *) return 1 ;;
    esac
}
