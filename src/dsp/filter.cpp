#include "dsp/filter.h"

#include <algorithm>
#include <stdexcept>
#include <string>

namespace Orvalis_NR {

namespace {

// Shortest transform createForFrames uses: below it the per-block copies outweigh the saving.
constexpr int kShortestFrameTransform = 1024;

// The inverse transform of `in` into `out` without its 1/N, where `transform` is the library's
// own; false for any other implementation.
bool inverseUnscaled(Dft& transform, const std::complex<double>* in, std::complex<double>* out) {
    auto* own = dynamic_cast<IppDft*>(&transform);
    if (own == nullptr) return false;
    const auto* from = reinterpret_cast<const double*>(in);
    auto* to = reinterpret_cast<double*>(out);
    if (own->fftTransform) {
        own->fftTransform->InverseFFTUnscaled(from, to);
        return true;
    }
    if (own->dftTransform) {
        own->dftTransform->InverseDFTUnscaled(from, to);
        return true;
    }
    return false;
}

}  // namespace

void Filter::filter(gsl::span<std::complex<double>> in, gsl::span<std::complex<double>> out) {
    filter(in.data(), gsl::narrow<int>(in.size()), out.data(), gsl::narrow<int>(out.size()));
}

void Filter::filter(const double* in, int inLength, double* out, int outLength) {
    if (inLength != outLength || inLength <= 0 || inLength % 2 != 0)
        throw std::invalid_argument("inputLength");
    filter(reinterpret_cast<const std::complex<double>*>(in), inLength / 2,
           reinterpret_cast<std::complex<double>*>(out), outLength / 2);
}

BasicFir::BasicFir(std::vector<std::complex<double>> coefficients_)
    : coefficients(std::move(coefficients_)) {
    if (coefficients.empty()) throw std::invalid_argument("m_coeff");
    delayLine.assign(coefficients.size(), {});
}

void BasicFir::filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                      int outLength) {
    if (inLength != outLength || inLength < 0) throw std::invalid_argument("iqInputLength");
    if (inLength > 0 && (in == nullptr || out == nullptr))
        throw std::invalid_argument(in == nullptr ? "in: null pointer" : "out: null pointer");
    const std::size_t m = coefficients.size();
    for (int n = 0; n < inLength; ++n) {
        std::copy(delayLine.begin() + 1, delayLine.end(), delayLine.begin());
        delayLine[m - 1] = in[n];
        std::complex<double> sum = 0.0;
        for (std::size_t i = 0; i < m; ++i) sum += coefficients[m - 1 - i] * delayLine[i];
        out[n] = sum;
    }
}

Fir::Fir(std::shared_ptr<Dft> transform_, std::vector<std::complex<double>> coefficients_)
    : BasicFir(std::move(coefficients_)), transform(std::move(transform_)) {
    if (!transform) throw std::invalid_argument("transform: null pointer");
    if (static_cast<int>(coefficients.size()) > transform->size())
        throw std::invalid_argument("m_coeff");
}

void Fir::filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                 int outLength) {
    if (inLength != outLength || inLength <= 0) throw std::invalid_argument("iqInputLength");
    if (in == nullptr || out == nullptr)
        throw std::invalid_argument(in == nullptr ? "in: null pointer" : "out: null pointer");
    const int size = transform->size();
    const int m = static_cast<int>(coefficients.size());
    const int length = inLength;
    if (static_cast<long long>(length) + m - 1 > size) throw std::invalid_argument("dft");

    if (spectrumSize != size || spectrum.size() != static_cast<std::size_t>(size)) {
        spectrum.assign(static_cast<std::size_t>(size), {});
        std::copy(coefficients.begin(), coefficients.end(), spectrum.begin());
        transform->dft(spectrum.data(), spectrum.data());
        // The inverse's 1/N moves into the spectrum (exact for a power of two), which saves a
        // pass over every block.
        spectrumScaled = dynamic_cast<IppDft*>(transform.get()) != nullptr;
        if (spectrumScaled) {
            const double scale = 1.0 / static_cast<double>(size);
            for (auto& value : spectrum) value *= scale;
        }
        work.assign(static_cast<std::size_t>(size), {});
        product.assign(static_cast<std::size_t>(size), {});
        spectrumSize = size;
    }

    // work = [input | zeros | the M - 1 inputs before this piece]: the circular convolution
    // then equals the linear one over the first L samples.
    std::copy(in, in + length, work.begin());
    std::fill(work.begin() + length, work.end() - (m - 1), std::complex<double>{});
    std::copy(delayLine.begin() + 1, delayLine.end(), work.end() - (m - 1));

    // New history: the last M inputs, reaching back into the old history for a short piece.
    if (length >= m) {
        std::copy(in + length - m, in + length, delayLine.begin());
    } else {
        std::copy(delayLine.begin() + length, delayLine.end(), delayLine.begin());
        std::copy(in, in + length, delayLine.end() - length);
    }

    // Out of place both ways: FFTW's out-of-place plans are the faster ones at these lengths.
    transform->dft(work.data(), product.data());
    for (int i = 0; i < size; ++i) product[i] *= spectrum[i];
    if (!spectrumScaled || !inverseUnscaled(*transform, product.data(), work.data()))
        transform->idft(product.data(), work.data());
    std::copy(work.begin(), work.begin() + length, out);
}

BlockFilter::BlockFilter(std::shared_ptr<Filter> inner_, int blockSize_)
    : inner(std::move(inner_)), blockSize(blockSize_) {
    if (!inner) throw std::invalid_argument("inner: null pointer");
    if (blockSize < 1)
        throw std::invalid_argument("blockSize: must be at least 1, got " +
                                    std::to_string(blockSize));
}

void BlockFilter::filter(const std::complex<double>* in, int inLength, std::complex<double>* out,
                         int outLength) {
    if (inLength != outLength || inLength <= 0) throw std::invalid_argument("iqInputLength");
    for (int offset = 0; offset < inLength; offset += blockSize) {
        const int piece = std::min(blockSize, inLength - offset);
        inner->filter(in + offset, piece, out + offset, piece);
    }
}

int overlapSaveLength(long long needed) {
    int length = 1;
    while (length < needed && length < 0x800000) length <<= 1;
    return length;
}

std::shared_ptr<BlockFilter> FilterCreator::create(std::vector<std::complex<double>> coefficients,
                                                   int blockSize) {
    if (coefficients.empty()) throw std::invalid_argument("coeff");
    const int count = static_cast<int>(coefficients.size());
    const int effectiveBlock = std::max(blockSize, count);
    const int length = overlapSaveLength(static_cast<long long>(effectiveBlock) + count - 1);
    auto transform = std::make_shared<IppDft>(length);
    auto fir = std::make_shared<Fir>(std::move(transform), std::move(coefficients));
    return std::make_shared<BlockFilter>(std::move(fir), effectiveBlock);
}

std::shared_ptr<BlockFilter> FilterCreator::createForFrames(std::vector<std::complex<double>> coefficients) {
    if (coefficients.empty()) throw std::invalid_argument("coeff");
    const int count = static_cast<int>(coefficients.size());
    // FFTW's estimated plans lose speed per point beyond a few thousand points, while a block
    // much shorter than the filter wastes the transform on history: about twice the filter wins.
    const int length = std::max(kShortestFrameTransform, overlapSaveLength(2LL * (count - 1)));
    if (length - count + 1 < 1) return create(std::move(coefficients), count);  // beyond the longest transform
    auto fir = std::make_shared<Fir>(std::make_shared<IppDft>(length), std::move(coefficients));
    return std::make_shared<BlockFilter>(std::move(fir), length - count + 1);
}

}  // namespace Orvalis_NR
