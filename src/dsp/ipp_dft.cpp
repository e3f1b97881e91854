#include "dsp/ipp_dft.h"

#include <stdexcept>
#include <string>

namespace Orvalis_NR {

IppDft::IppDft(int size) {
    resize(size);
}

void IppDft::resize(int size) {
    if (size < 1)
        throw std::invalid_argument("size: must be at least 1, got " + std::to_string(size));
    if (isPowerOfTwo(size)) {
        auto made = std::make_unique<FFT>();
        made->Init(size);
        fftTransform = std::move(made);
        dftTransform.reset();
    } else {
        auto made = std::make_unique<DFT>();
        made->Init(size);
        dftTransform = std::move(made);
        fftTransform.reset();
    }
    currentSize = size;
}

void IppDft::transform(bool inverse, const double* in, double* out) {
    if (fftTransform) {
        inverse ? fftTransform->InverseFFT(in, out) : fftTransform->ForwardFFT(in, out);
    } else if (dftTransform) {
        inverse ? dftTransform->InverseDFT(in, out) : dftTransform->ForwardDFT(in, out);
    } else {
        throw std::invalid_argument("size: 0, resize was not called");
    }
}

void IppDft::checkAndResize(std::size_t inLength, std::size_t outLength) {
    if (inLength != outLength) throw std::invalid_argument("input");
    const int length = gsl::narrow<int>(inLength);
    if (length != currentSize) resize(length);
}

void IppDft::dft(gsl::span<const std::complex<double>> in, gsl::span<std::complex<double>> out) {
    checkAndResize(in.size(), out.size());
    dft(in.data(), out.data());
}

void IppDft::dft(const std::complex<double>* in, std::complex<double>* out) {
    transform(false, reinterpret_cast<const double*>(in), reinterpret_cast<double*>(out));
}

void IppDft::dft(double* in, double* out) {
    transform(false, in, out);
}

void IppDft::idft(gsl::span<const std::complex<double>> in, gsl::span<std::complex<double>> out) {
    checkAndResize(in.size(), out.size());
    idft(in.data(), out.data());
}

void IppDft::idft(const std::complex<double>* in, std::complex<double>* out) {
    transform(true, reinterpret_cast<const double*>(in), reinterpret_cast<double*>(out));
}

void IppDft::idft(double* in, double* out) {
    transform(true, in, out);
}

}  // namespace Orvalis_NR
