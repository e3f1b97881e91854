#pragma once
// Complex FIR filters. Every filter keeps its history from call to call, so a waveform pushed
// through it a frame at a time comes out as one convolution over the whole waveform.

#include <complex>
#include <gsl/gsl>
#include <memory>
#include <vector>

#include "dsp/ipp_dft.h"

namespace Orvalis_NR {

class Filter {
  public:
    virtual ~Filter() = default;
    /// The filter's taps, oldest input first in the convolution sum's sense: y[n] = sum c[k]
    /// x[n-k].
    virtual std::vector<std::complex<double>>& getCoefficients() = 0;
    /// The last inputs, as many as there are coefficients, newest at the end.
    virtual std::vector<std::complex<double>>& getDelayLine() = 0;
    /// Forwards to the pointer form.
    virtual void filter(gsl::span<std::complex<double>> in, gsl::span<std::complex<double>> out);
    /// inLength == outLength; `in` may equal `out` (filtering in place).
    virtual void filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                        int outLength) = 0;
    /// Interleaved real and imaginary parts: lengths count doubles and must be equal, even and
    /// non-zero ("inputLength" otherwise).
    virtual void filter(const double* in, int inLength, double* out, int outLength);
};

/// The direct form, one sample at a time: the plain reference of the family.
class BasicFir : public Filter {
  public:
    /// coefficients: at least one ("m_coeff" otherwise). The delay line starts at zero.
    explicit BasicFir(std::vector<std::complex<double>> coefficients);

    using Filter::filter;
    std::vector<std::complex<double>>& getCoefficients() override { return coefficients; }
    std::vector<std::complex<double>>& getDelayLine() override { return delayLine; }
    void filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                int outLength) override;

    std::vector<std::complex<double>> coefficients;
    std::vector<std::complex<double>> delayLine;
};

/// Overlap-save filtering through a transform of fixed length: a piece of L samples needs
/// L + M - 1 <= transform size for M coefficients ("dft" otherwise).
class Fir : public BasicFir {
  public:
    /// transform: sized to at least the coefficient count ("m_coeff" otherwise).
    Fir(std::shared_ptr<Dft> transform, std::vector<std::complex<double>> coefficients);

    using Filter::filter;
    void filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                int outLength) override;

    std::shared_ptr<Dft> transform;
    std::vector<std::complex<double>> spectrum;  // transform of the zero-padded coefficients
    std::vector<std::complex<double>> work;
    std::vector<std::complex<double>> product;  // the block's spectrum times the filter's

  private:
    int spectrumSize = 0;         // transform size `spectrum` was made for
    bool spectrumScaled = false;  // `spectrum` carries the inverse's 1/N
};

/// Cuts its input into pieces of at most blockSize samples for the inner filter.
class BlockFilter : public Filter {
  public:
    /// inner: not null; blockSize: >= 1.
    BlockFilter(std::shared_ptr<Filter> inner, int blockSize);

    using Filter::filter;
    std::vector<std::complex<double>>& getCoefficients() override {
        return inner->getCoefficients();
    }
    std::vector<std::complex<double>>& getDelayLine() override { return inner->getDelayLine(); }
    /// Non-empty and equal lengths ("iqInputLength" otherwise).
    void filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                int outLength) override;

    std::shared_ptr<Filter> inner;
    int blockSize;
};

struct FilterCreator {
    /// The working filter: overlap-save over pieces of max(blockSize, M) samples, through a
    /// power-of-two transform. coefficients: at least one ("coeff" otherwise).
    static std::shared_ptr<BlockFilter> create(std::vector<std::complex<double>> coefficients,
                                               int blockSize);
    /// The same convolution for frame-long rows, with the transform length and block that cost
    /// least per output sample: a power of two of about twice the coefficient count, each block
    /// filling the transform. coefficients: at least one ("coeff" otherwise).
    static std::shared_ptr<BlockFilter> createForFrames(std::vector<std::complex<double>> coefficients);
};

/// Transform length for overlap-save of `needed` = block + M - 1 samples: the first power of two
/// at or above it, the search stopping at 0x800000.
int overlapSaveLength(long long needed);

}  // namespace Orvalis_NR
