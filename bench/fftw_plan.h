#ifndef QX_BENCH_FFTW_PLAN_H
#define QX_BENCH_FFTW_PLAN_H

#ifdef QX_PEER_FFTW3

#include <cstddef>
#include <fftw3.h>

namespace qx::bench {

// A plan of FFTW on its own memory, with the alignment that it prefers. FFTW_MEASURE uses the best plan that
// it finds in ten seconds, in which it finishes its search except for the longest transforms.
class FFTWPlan {
public:
    // make(in, out) returns the plan; both arrays have `values` doubles.
    template <class Make>
    FFTWPlan(std::size_t values, const Make &make)
        : in_(fftw_alloc_real(values)), out_(fftw_alloc_real(values)) {
        fftw_set_timelimit(10);
        plan_ = make(in_, out_);
        for (std::size_t i = 0; i < values; ++i) // planning overwrites them
            in_[i] = static_cast<double>(i * 7919 % 1024) / 512 - 1;
    }
    ~FFTWPlan() {
        fftw_destroy_plan(plan_);
        fftw_free(in_);
        fftw_free(out_);
    }
    FFTWPlan(const FFTWPlan &) = delete;
    FFTWPlan &operator=(const FFTWPlan &) = delete;

    void operator()() const { fftw_execute(plan_); }
    // The same on one of several blocks of data, `offset` doubles from the first.
    void complexAt(std::size_t offset) const {
        fftw_execute_dft(plan_, Complex(in_ + offset), Complex(out_ + offset));
    }
    void realAt(std::size_t offset) const {
        fftw_execute_dft_r2c(plan_, in_ + offset, Complex(out_ + offset));
    }

    static fftw_complex *Complex(double *values) {
        return reinterpret_cast<fftw_complex *>(values);
    }

private:
    double *in_, *out_;
    fftw_plan plan_;
};

} // namespace qx::bench

#endif

#endif
