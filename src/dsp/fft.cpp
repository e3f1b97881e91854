#include "dsp/fft.h"

#include <stdexcept>
#include <string>
#include <utility>

#include "dsp/fftw_transform.h"

namespace Orvalis_NR {

namespace {

constexpr int kLargestLength = 1 << 30;

std::unique_ptr<detail::FftwTransform> planFor(int length) {
    return length > 0 ? std::make_unique<detail::FftwTransform>(length) : nullptr;
}

detail::FftwTransform& ready(const std::unique_ptr<detail::FftwTransform>& state, const char* who) {
    if (!state) throw std::invalid_argument(std::string(who) + ": size 0, Init was not called");
    return *state;
}

}  // namespace

FFT::FFT() = default;
FFT::~FFT() = default;
FFT::FFT(FFT&& other) noexcept
    : length(std::exchange(other.length, 0)),
      transformOrder(std::exchange(other.transformOrder, 0)),
      state(std::move(other.state)) {}

FFT& FFT::operator=(FFT&& other) noexcept {
    length = std::exchange(other.length, 0);
    transformOrder = std::exchange(other.transformOrder, 0);
    state = std::move(other.state);
    return *this;
}

FFT::FFT(const FFT& other)
    : length(other.length), transformOrder(other.transformOrder), state(planFor(other.length)) {}

FFT& FFT::operator=(const FFT& other) {
    if (this != &other) {
        state = planFor(other.length);
        length = other.length;
        transformOrder = other.transformOrder;
    }
    return *this;
}

void FFT::Init(int size) {
    if (!isPowerOfTwo(size) || size > kLargestLength)
        throw std::invalid_argument("size: FFT length must be a power of two up to 2^30, got " +
                                    std::to_string(size));
    if (size == length && state) return;  // already planned for this length
    state = planFor(size);
    length = size;
    transformOrder = 0;
    while ((1 << transformOrder) < size) ++transformOrder;
}

void FFT::ForwardFFT(const double* in, double* out) {
    ready(state, "FFT").execute(false, in, out);
}

void FFT::InverseFFT(const double* in, double* out) {
    ready(state, "FFT").execute(true, in, out);
}

void FFT::InverseFFT(const double* in, double* out, std::complex<double> factor) {
    ready(state, "FFT").inverseTimes(in, out, factor);
}

void FFT::InverseFFTUnscaled(const double* in, double* out) {
    ready(state, "FFT").executeUnscaled(true, in, out);
}

DFT::DFT() = default;
DFT::~DFT() = default;
DFT::DFT(DFT&& other) noexcept
    : length(std::exchange(other.length, 0)), state(std::move(other.state)) {}

DFT& DFT::operator=(DFT&& other) noexcept {
    length = std::exchange(other.length, 0);
    state = std::move(other.state);
    return *this;
}

DFT::DFT(const DFT& other) : length(other.length), state(planFor(other.length)) {}

DFT& DFT::operator=(const DFT& other) {
    if (this != &other) {
        state = planFor(other.length);
        length = other.length;
    }
    return *this;
}

void DFT::Init(int size) {
    if (size < 1 || size > kLargestLength)
        throw std::invalid_argument("size: DFT length must be 1 .. 2^30, got " +
                                    std::to_string(size));
    if (size == length && state) return;
    state = planFor(size);
    length = size;
}

void DFT::ForwardDFT(const double* in, double* out) {
    ready(state, "DFT").execute(false, in, out);
}

void DFT::InverseDFT(const double* in, double* out) {
    ready(state, "DFT").execute(true, in, out);
}

void DFT::InverseDFT(const double* in, double* out, std::complex<double> factor) {
    ready(state, "DFT").inverseTimes(in, out, factor);
}

void DFT::InverseDFTUnscaled(const double* in, double* out) {
    ready(state, "DFT").executeUnscaled(true, in, out);
}

}  // namespace Orvalis_NR
