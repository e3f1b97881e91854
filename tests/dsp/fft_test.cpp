#include "dsp/fft.h"

#include <fftw3.h>
#include <gtest/gtest.h>

#include <functional>
#include <stdexcept>
#include <string>

#include "dsp/filter.h"
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

// A host process may have planned or imported FFTW wisdom of its own before it uses the library;
// FFTW then plans differently. Transforms and frame filters must stay within tolerance of the
// direct sums either way.
TEST(TransformWrappers, HostWisdomLeavesResultsWithinTolerance) {
    constexpr int kLengths[] = {1024, 1536};
    const Samples taps = randomSamples(65, 3);  // a frame filter of a 1024-point transform
    const Samples input = randomSamples(3000, 4);
    const Samples filtered = directConvolution(taps, input);
    const auto check = [&](const char* when) {
        for (int n : kLengths) {
            const Samples x = randomSamples(static_cast<std::size_t>(n), 5u + n);
            const Samples expected = directDft(x), expectedInverse = directIdft(x);
            IppDft dft(n);
            Samples forward(static_cast<std::size_t>(n)), inverse(static_cast<std::size_t>(n)), inPlace = x;
            dft.dft(x.data(), forward.data());
            dft.idft(x.data(), inverse.data());
            dft.dft(inPlace.data(), inPlace.data());
            EXPECT_LE(maxAbsDifference(forward, expected), tolerance(expected)) << when << ", length " << n;
            EXPECT_LE(maxAbsDifference(inverse, expectedInverse), tolerance(expectedInverse)) << when << ", length " << n;
            EXPECT_LE(maxAbsDifference(inPlace, expected), tolerance(expected)) << when << ", length " << n;
        }
        Samples output(input.size());
        Orvalis_NR::FilterCreator::createForFrames(taps)->filter(input.data(), static_cast<int>(input.size()),
                                                                  output.data(), static_cast<int>(output.size()));
        EXPECT_LE(maxAbsDifference(output, filtered), tolerance(filtered)) << when;
    };
    check("without wisdom");

    // The host measures its own plans of the same lengths (briefly), exports the wisdom, forgets
    // it and loads it back, as it would from a file.
    fftw_set_timelimit(0.01);
    for (int n : kLengths) {
        fftw_complex* a = fftw_alloc_complex(static_cast<std::size_t>(n));
        fftw_complex* b = fftw_alloc_complex(static_cast<std::size_t>(n));
        for (int sign : {FFTW_FORWARD, FFTW_BACKWARD})
            for (fftw_complex* out : {a, b}) fftw_destroy_plan(fftw_plan_dft_1d(n, a, out, sign, FFTW_MEASURE));
        fftw_free(a);
        fftw_free(b);
    }
    fftw_set_timelimit(FFTW_NO_TIMELIMIT);
    char* wisdom = fftw_export_wisdom_to_string();
    ASSERT_NE(wisdom, nullptr);
    fftw_forget_wisdom();
    EXPECT_EQ(fftw_import_wisdom_from_string(wisdom), 1);
    fftw_free(wisdom);
    check("with the host's wisdom");
    fftw_forget_wisdom();  // leave the process as it was
}

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
