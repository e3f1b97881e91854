#pragma once
// Complex double transforms: FFT for power-of-two lengths, DFT for any length. Both follow one
// scaling rule: the forward transform is unscaled, the inverse divides by the length, so that
// InverseFFT(ForwardFFT(x)) == x. Data are interleaved real and imaginary parts.

#include <complex>
#include <memory>

namespace Orvalis_NR {

namespace detail {
class FftwTransform;
}

/// Power-of-two transform. Init once per length; the transforms themselves do not allocate.
class FFT {
  public:
    FFT();
    ~FFT();
    FFT(const FFT& other);
    FFT& operator=(const FFT& other);
    FFT(FFT&& other) noexcept;
    FFT& operator=(FFT&& other) noexcept;

    /// size: a power of two, 1 .. 2^30.
    void Init(int size);
    /// out[k] = sum_n in[n] exp(-j 2 pi n k / N); `in` and `out` hold N complex values each.
    void ForwardFFT(const double* in, double* out);
    /// out[n] = 1/N sum_k in[k] exp(+j 2 pi n k / N).
    void InverseFFT(const double* in, double* out);
    /// InverseFFT times `factor`, in one pass over the result.
    void InverseFFT(const double* in, double* out, std::complex<double> factor);
    /// N times InverseFFT: the caller applies 1/N in a pass it makes anyway.
    void InverseFFTUnscaled(const double* in, double* out);

    /// Length given to Init, 0 before.
    int size() const { return length; }
    /// log2 of the length.
    int order() const { return transformOrder; }

  private:
    int length = 0;
    int transformOrder = 0;
    std::unique_ptr<detail::FftwTransform> state;
};

/// Transform of any length >= 1, with the same scaling as FFT.
class DFT {
  public:
    DFT();
    ~DFT();
    DFT(const DFT& other);
    DFT& operator=(const DFT& other);
    DFT(DFT&& other) noexcept;
    DFT& operator=(DFT&& other) noexcept;

    /// size: 1 .. 2^30.
    void Init(int size);
    void ForwardDFT(const double* in, double* out);
    void InverseDFT(const double* in, double* out);
    void InverseDFT(const double* in, double* out, std::complex<double> factor);
    /// N times InverseDFT.
    void InverseDFTUnscaled(const double* in, double* out);

    int size() const { return length; }

  private:
    int length = 0;
    std::unique_ptr<detail::FftwTransform> state;
};

/// True for 1, 2, 4, 8, ...
constexpr bool isPowerOfTwo(int n) {
    return n > 0 && (n & (n - 1)) == 0;
}

}  // namespace Orvalis_NR
