// qx ("NAME", INPUT...): calls an export with its inputs in order and returns its outputs in order.
//
//     mean = qx ("Mean_head", [1 2 4]);
//     [values, vectors] = qx ("EigenValueVector_head", [2 1; 1 3], 1);
//
// A number or an element that an export takes as an integer must be one that fits, and a real one must have no
// imaginary part; anything else is refused.
//
// Built by: mkoctfile -std=c++20 qx.cc -I.../include -I.../build/release/include -L.../build/release -lqxanalysis -lqxrt

#include <octave/oct.h>

#include "qx/calls.hpp"
#include "qx/qx.h"

#include <cmath>
#include <limits>
#include <map>
#include <sstream>
#include <string>

namespace {

[[noreturn]] void wrong(const std::string &what) {
    error("%s", what.c_str());
    throw std::logic_error(what); // error does not return
}

// The inputs of a call.
class In {
public:
    explicit In(const octave_value_list &values) : values_(values) {}

    template <class T>
    T number(int i) const {
        const std::complex<double> z = complex(i);
        if (z.imag() != 0)
            refuse(i, "a real number is needed");
        return converted<T>(i, z.real());
    }
    std::complex<double> complex(int i) const {
        if (values_(i + 1).numel() != 1)
            refuse(i, "one number is needed");
        return values_(i + 1).complex_value();
    }

    template <class T>
    qx::detail::Array1<T> array1(int i) const {
        const std::vector<T> all = elements<T>(i, false);
        qx::detail::Call call("");
        qx::detail::Array1<T> made(call, "", all);
        return checked(call, std::move(made));
    }
    template <class T>
    qx::detail::Array2<T> array2(int i) const {
        const std::vector<T> all = elements<T>(i, true);
        const dim_vector sizes = values_(i + 1).dims();
        qx::detail::Call call("");
        qx::detail::Array2<T> made(call, "",
                                   {all.data(), static_cast<std::size_t>(sizes(0)), static_cast<std::size_t>(sizes(1))});
        return checked(call, std::move(made));
    }
    template <class T>
    static qx::detail::Array1<T> empty1() {
        qx::detail::Call call("");
        return checked(call, qx::detail::Array1<T>(call));
    }
    template <class T>
    static qx::detail::Array2<T> empty2() {
        qx::detail::Call call("");
        return checked(call, qx::detail::Array2<T>(call));
    }

private:
    [[noreturn]] static void refuse(int i, const std::string &why) {
        wrong("qx: input " + std::to_string(i + 1) + ": " + why);
    }
    template <class T>
    static T converted(int i, double x) {
        typedef std::numeric_limits<T> Limits;
        if constexpr (Limits::is_integer) {
            if (!(x >= Limits::min() && x <= Limits::max() && x == std::floor(x))) {
                std::ostringstream text;
                text.precision(15);
                text << x << " is not an integer of " << 8 * sizeof(T) << " bits";
                refuse(i, text.str());
            }
        }
        return static_cast<T>(x);
    }
    template <class Array>
    static Array checked(const qx::detail::Call &call, Array made) {
        if (!call.ready())
            wrong("qx: no memory");
        return made;
    }
    // In the order of Octave's matrix, or row by row.
    template <class T>
    std::vector<T> elements(int i, bool byRows) const {
        std::vector<T> all;
        const ComplexMatrix m = values_(i + 1).complex_matrix_value();
        all.reserve(static_cast<std::size_t>(m.numel()));
        const octave_idx_type rows = m.rows(), cols = m.cols();
        for (octave_idx_type k = 0; k < rows * cols; ++k) {
            const Complex z = byRows ? m(k / cols, k % cols) : m(k % rows, k / rows);
            if constexpr (std::is_arithmetic_v<T>) {
                if (z.imag() != 0)
                    refuse(i, "real numbers are needed");
                all.push_back(converted<T>(i, z.real()));
            } else
                all.push_back(T(static_cast<typename T::value_type>(z.real()),
                                static_cast<typename T::value_type>(z.imag())));
        }
        return all;
    }
    const octave_value_list &values_;
};

// The outputs of a call.
class Out {
public:
    template <class T>
    void add(const T &number)
        requires std::is_arithmetic_v<T>
    {
        values.append(octave_value(static_cast<double>(number)));
    }
    void add(const std::complex<double> &number) { values.append(octave_value(number)); }
    template <class T>
    void add(const qx::detail::Array1<T> &array) {
        const auto found = array.span();
        add(found.data(), 1, found.size());
    }
    template <class T>
    void add(const qx::detail::Array2<T> &array) {
        const auto found = array.view();
        add(found.data, found.rows, found.cols);
    }
    octave_value_list values;

private:
    template <class T>
    void add(const T *data, std::size_t rows, std::size_t cols) {
        const auto m = static_cast<octave_idx_type>(rows), n = static_cast<octave_idx_type>(cols);
        if constexpr (std::is_arithmetic_v<T>) {
            Matrix made(m, n);
            for (octave_idx_type k = 0; k < m * n; ++k)
                made(k / n, k % n) = static_cast<double>(data[k]);
            values.append(octave_value(made));
        } else {
            ComplexMatrix made(m, n);
            for (octave_idx_type k = 0; k < m * n; ++k)
                made(k / n, k % n) = Complex(data[k].real(), data[k].imag());
            values.append(octave_value(made));
        }
    }
};

struct Entry {
    void (*call)(const In &, Out &);
    int inputs;
};

void check(const char *name, ErrorCode code) {
    if (code < 0 || code == QXHostBadArgument || code == QXHostNoMemory)
        wrong(std::string(name) + ": " + QXHostErrorText(code) + " (" + QXHostErrorName(code) + ")");
    if (code > 0)
        warning("%s: %s (%s)", name, QXHostErrorText(code), QXHostErrorName(code));
}

#include "exports.inc"

} // namespace

DEFUN_DLD(qx, args, , "qx (\"NAME\", INPUT...): calls an export of the QX analysis library") {
    if (args.length() == 0)
        print_usage();
    const std::string name = args(0).string_value();
    const auto entry = entries.find(name);
    if (entry == entries.end())
        wrong("qx: there is no " + name + ", or it has arguments that Octave has no values for");
    if (args.length() != entry->second.inputs + 1)
        wrong(name + ": " + std::to_string(entry->second.inputs) + " inputs are needed");
    Out out;
    entry->second.call(In(args), out);
    return out.values;
}
