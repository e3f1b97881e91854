#pragma once
// The transform interface used by the transform precoder and the filters, and its one
// implementation, which picks the power-of-two FFT or the general DFT by length.

#include <complex>
#include <gsl/gsl>
#include <memory>

#include "dsp/fft.h"

namespace Orvalis_NR {

/// Forward (unscaled) and inverse (divided by the length) complex transforms of one length.
class Dft {
  public:
    virtual ~Dft() = default;
    virtual void resize(int size) = 0;
    virtual int size() const = 0;
    virtual void dft(gsl::span<const std::complex<double>> in,
                     gsl::span<std::complex<double>> out) = 0;
    virtual void dft(const std::complex<double>* in, std::complex<double>* out) = 0;
    /// Interleaved real and imaginary parts, size() complex values each.
    virtual void dft(double* in, double* out) = 0;
    virtual void idft(gsl::span<const std::complex<double>> in,
                      gsl::span<std::complex<double>> out) = 0;
    virtual void idft(const std::complex<double>* in, std::complex<double>* out) = 0;
    virtual void idft(double* in, double* out) = 0;
};

/// Span forms check that `in` and `out` have equal length ("input" otherwise) and resize to
/// that length when it differs from size(). `in` and `out` may be the same buffer.
class IppDft : public Dft {
  public:
    IppDft() = default;
    /// size: >= 1.
    explicit IppDft(int size);

    /// An FFT for a power of two, a DFT otherwise; the other is released.
    void resize(int size) override;
    int size() const override { return currentSize; }
    void dft(gsl::span<const std::complex<double>> in,
             gsl::span<std::complex<double>> out) override;
    void dft(const std::complex<double>* in, std::complex<double>* out) override;
    void dft(double* in, double* out) override;
    void idft(gsl::span<const std::complex<double>> in,
              gsl::span<std::complex<double>> out) override;
    void idft(const std::complex<double>* in, std::complex<double>* out) override;
    void idft(double* in, double* out) override;

    int currentSize = 0;
    std::unique_ptr<FFT> fftTransform;  // only one of the two exists once sized
    std::unique_ptr<DFT> dftTransform;

  private:
    void transform(bool inverse, const double* in, double* out);
    void checkAndResize(std::size_t inLength, std::size_t outLength);
};

}  // namespace Orvalis_NR
