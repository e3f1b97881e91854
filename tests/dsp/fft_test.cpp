#include "dsp/fft.h"

#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <string>

#include "dsp/ipp_dft.h"
#include "dsp_oracles.h"

namespace dsp_test {
namespace {

using Orvalis_NR::DFT;
using Orvalis_NR::FFT;
using Orvalis_NR::IppDft;

double* raw(Samples& x) {
    return reinterpret_cast<double*>(x.data());
}
const double* raw(const Samples& x) {
    return reinterpret_cast<const double*>(x.data());
}

// Every transform wrapper, reduced to "forward" and "inverse" on interleaved data.
struct Wrapper {
    const char* name;
    bool powerOfTwoOnly;
    std::function<void(int, bool, const double*, double*)> run;
};

const Wrapper kWrappers[] = {
    {"FFT", true,
     [](int n, bool inverse, const double* in, double* out) {
         FFT fft;
         fft.Init(n);
         inverse ? fft.InverseFFT(in, out) : fft.ForwardFFT(in, out);
     }},
    {"DFT", false,
     [](int n, bool inverse, const double* in, double* out) {
         DFT dft;
         dft.Init(n);
         inverse ? dft.InverseDFT(in, out) : dft.ForwardDFT(in, out);
     }},
    {"IppDft", false,
     [](int n, bool inverse, const double* in, double* out) {
         IppDft dft(n);
         auto* input = const_cast<double*>(in);
         inverse ? dft.idft(input, out) : dft.dft(input, out);
     }},
};

struct TransformCase {
    int wrapper;
    int size;
};

std::vector<TransformCase> transformCases() {
    std::vector<TransformCase> cases;
    for (int w = 0; w < 3; ++w)
        for (int n : {1, 2, 3, 5, 8, 12, 30, 64, 100, 243, 1000, 1024, 1536, 2048})
            if (!kWrappers[w].powerOfTwoOnly || Orvalis_NR::isPowerOfTwo(n))
                cases.push_back({w, n});
    return cases;
}

class TransformAgainstDirectSum : public ::testing::TestWithParam<TransformCase> {};

TEST_P(TransformAgainstDirectSum, ForwardUnscaledInverseOverLengthInPlaceAndMisaligned) {
    const Wrapper& wrapper = kWrappers[GetParam().wrapper];
    const int n = GetParam().size;
    const Samples x = randomSamples(n, 17u + n);
    Samples forward(n), inverse(n);
    wrapper.run(n, false, raw(x), raw(forward));
    wrapper.run(n, true, raw(x), raw(inverse));
    const Samples expected = directDft(x);
    const Samples expectedInverse = directIdft(x);
    EXPECT_LE(maxAbsDifference(forward, expected), tolerance(expected));
    EXPECT_LE(maxAbsDifference(inverse, expectedInverse), tolerance(expectedInverse));

    Samples inPlace = x;
    wrapper.run(n, false, raw(inPlace), raw(inPlace));
    EXPECT_LE(maxAbsDifference(inPlace, expected), tolerance(expected));

    // Shifted by one double: the interleaved data no longer meets the planned alignment.
    std::vector<double> in(2 * n + 1), out(2 * n + 3);
    std::copy(raw(x), raw(x) + 2 * n, in.begin() + 1);
    wrapper.run(n, false, in.data() + 1, out.data() + 1);
    EXPECT_LE(
        maxAbsDifference(reinterpret_cast<const Complex*>(out.data() + 1), expected.data(), n),
        tolerance(expected));
    EXPECT_EQ(out[0], 0.0);
    EXPECT_EQ(out[2 * n + 1], 0.0);
}

INSTANTIATE_TEST_SUITE_P(Sizes, TransformAgainstDirectSum, ::testing::ValuesIn(transformCases()),
                         [](const auto& info) {
                             return std::string(kWrappers[info.param.wrapper].name) + "_" +
                                    std::to_string(info.param.size);
                         });

TEST(TransformWrappers, CopiesPlanTheirOwnTransform) {
    FFT original;
    original.Init(16);
    FFT copy = original;
    original = FFT();  // the copy must not lean on the original's plans
    const Samples x = randomSamples(16, 9);
    Samples y(16);
    copy.ForwardFFT(raw(x), raw(y));
    EXPECT_LE(maxAbsDifference(y, directDft(x)), 1e-12);
}

TEST(TransformWrappers, RefuseBadLengthsUnsetStateAndOverlap) {
    FFT fft;
    DFT dft;
    EXPECT_THROW(fft.Init(12), std::invalid_argument);
    EXPECT_THROW(dft.Init(0), std::invalid_argument);
    Samples x(4), y(4);
    EXPECT_THROW(fft.ForwardFFT(raw(x), raw(y)), std::invalid_argument);
    fft.Init(4);
    // Partly overlapping buffers cannot be transformed; equal ones can.
    Samples z(6);
    EXPECT_THROW(fft.ForwardFFT(raw(z), raw(z) + 2), std::invalid_argument);
    EXPECT_NO_THROW(fft.ForwardFFT(raw(z), raw(z)));
}

}  // namespace
}  // namespace dsp_test
