#pragma once
// One complex double transform length planned with FFTW: the state behind FFT and DFT.
// Plans are made once, here; executing never plans or allocates.

#include <fftw3.h>

#include <complex>

namespace Orvalis_NR::detail {

class FftwTransform {
  public:
    /// Plans forward and inverse transforms of `length` (>= 1) samples, in place and out of place.
    explicit FftwTransform(int length);
    ~FftwTransform();
    FftwTransform(const FftwTransform&) = delete;
    FftwTransform& operator=(const FftwTransform&) = delete;

    /// Forward (exp(-j 2 pi n k / N), unscaled) or inverse (exp(+j 2 pi n k / N), divided by N)
    /// transform of `length` interleaved complex values. `in` may equal `out`; other overlaps
    /// are refused.
    void execute(bool inverse, const double* in, double* out);
    /// Inverse transform, divided by the length and multiplied by `factor`, in one pass.
    void inverseTimes(const double* in, double* out, std::complex<double> factor);
    /// The transform alone, the inverse not divided by the length: for callers that fold the
    /// scaling into a pass of their own.
    void executeUnscaled(bool inverse, const double* in, double* out) { transform(inverse, in, out); }

    int length() const { return length_; }

  private:
    void release();
    void transform(bool inverse, const double* in, double* out);

    int length_;
    fftw_complex* input_;  // planning buffers, also the staging area for misaligned data
    fftw_complex* output_;
    fftw_plan forward_ = nullptr;
    fftw_plan inverse_ = nullptr;
    fftw_plan forwardInPlace_ = nullptr;
    fftw_plan inverseInPlace_ = nullptr;
};

}  // namespace Orvalis_NR::detail
