#include "dsp/fftw_transform.h"

#include <algorithm>
#include <cstdint>
#include <new>
#include <stdexcept>
#include <string>

namespace Orvalis_NR::detail {

namespace {

// FFTW_ESTIMATE keeps planning cheap and, unlike measured plans, gives the same algorithm and
// so bit-identical samples on every run.
constexpr unsigned kPlanFlags = FFTW_ESTIMATE;

bool sameAlignment(const double* p, const fftw_complex* reference) {
    return fftw_alignment_of(const_cast<double*>(p)) ==
           fftw_alignment_of(reinterpret_cast<double*>(const_cast<fftw_complex*>(reference)));
}

}  // namespace

FftwTransform::FftwTransform(int length) : length_(length) {
    if (length < 1)
        throw std::invalid_argument("length: transform length must be at least 1, got " +
                                    std::to_string(length));
    input_ = fftw_alloc_complex(static_cast<std::size_t>(length));
    output_ = fftw_alloc_complex(static_cast<std::size_t>(length));
    if (input_ == nullptr || output_ == nullptr) {
        fftw_free(input_);
        fftw_free(output_);
        throw std::bad_alloc();
    }
    forward_ =
        fftw_plan_dft_1d(length, input_, output_, FFTW_FORWARD, kPlanFlags | FFTW_PRESERVE_INPUT);
    inverse_ =
        fftw_plan_dft_1d(length, input_, output_, FFTW_BACKWARD, kPlanFlags | FFTW_PRESERVE_INPUT);
    forwardInPlace_ = fftw_plan_dft_1d(length, input_, input_, FFTW_FORWARD, kPlanFlags);
    inverseInPlace_ = fftw_plan_dft_1d(length, input_, input_, FFTW_BACKWARD, kPlanFlags);
    if (!forward_ || !inverse_ || !forwardInPlace_ || !inverseInPlace_) {
        release();
        throw std::runtime_error("FFTW could not plan a transform of length " +
                                 std::to_string(length));
    }
}

FftwTransform::~FftwTransform() {
    release();
}

void FftwTransform::release() {
    for (fftw_plan plan : {forward_, inverse_, forwardInPlace_, inverseInPlace_})
        if (plan) fftw_destroy_plan(plan);
    forward_ = inverse_ = forwardInPlace_ = inverseInPlace_ = nullptr;
    fftw_free(input_);
    fftw_free(output_);
    input_ = output_ = nullptr;
}

void FftwTransform::execute(bool inverse, const double* in, double* out) {
    transform(inverse, in, out);
    if (inverse) {
        const double scale = 1.0 / static_cast<double>(length_);
        for (std::size_t i = 0; i < 2 * static_cast<std::size_t>(length_); ++i) out[i] *= scale;
    }
}

void FftwTransform::inverseTimes(const double* in, double* out, std::complex<double> factor) {
    transform(true, in, out);
    factor /= static_cast<double>(length_);
    auto* values = reinterpret_cast<std::complex<double>*>(out);
    for (int i = 0; i < length_; ++i) values[i] *= factor;
}

void FftwTransform::transform(bool inverse, const double* in, double* out) {
    if (in == nullptr) throw std::invalid_argument("in: null pointer");
    if (out == nullptr) throw std::invalid_argument("out: null pointer");
    const auto n = static_cast<std::size_t>(length_);
    const auto inAddress = reinterpret_cast<std::uintptr_t>(in);
    const auto outAddress = reinterpret_cast<std::uintptr_t>(out);
    const std::uintptr_t bytes = n * sizeof(fftw_complex);
    const bool inPlace = inAddress == outAddress;
    if (!inPlace && inAddress < outAddress + bytes && outAddress < inAddress + bytes)
        throw std::invalid_argument("out: overlaps in without being equal to it");

    auto* target = reinterpret_cast<fftw_complex*>(out);
    const bool aligned = sameAlignment(in, input_) && sameAlignment(out, output_);
    if (aligned) {
        // The new-array execute interface: the plan runs on the caller's buffers directly.
        if (inPlace)
            fftw_execute_dft(inverse ? inverseInPlace_ : forwardInPlace_, target, target);
        else
            fftw_execute_dft(inverse ? inverse_ : forward_,
                             reinterpret_cast<fftw_complex*>(const_cast<double*>(in)), target);
    } else {
        std::copy(in, in + 2 * n, reinterpret_cast<double*>(input_));
        fftw_execute_dft(inverse ? inverse_ : forward_, input_, output_);
        std::copy(reinterpret_cast<double*>(output_), reinterpret_cast<double*>(output_) + 2 * n,
                  out);
    }
}

}  // namespace Orvalis_NR::detail
