#include "dsp/filter.h"

#include <gtest/gtest.h>

#include <functional>
#include <numeric>
#include <stdexcept>
#include <string>

#include "dsp_oracles.h"

namespace dsp_test {
namespace {

using Orvalis_NR::BasicFir;
using Orvalis_NR::BlockFilter;
using Orvalis_NR::Filter;
using Orvalis_NR::FilterCreator;
using Orvalis_NR::Fir;
using Orvalis_NR::IppDft;

struct FilterCase {
    const char* name;
    int taps;
    int blockSize;
    std::vector<int> calls;  // lengths of the successive calls
};

const FilterCase kFilterCases[] = {
    {"OneShortRow", 1025, 7000, {100}},
    {"RowOfThreePieces", 1025, 7000, {20000}},
    {"UnevenCalls", 1025, 7000, {7000, 1, 13000, 333}},
    {"CallsShorterThanFilter", 200, 300, {150, 150, 77, 1, 600}},
    {"SingleTap", 1, 7000, {50, 50}},
    {"TinyBlocks", 7, 4, {3, 10, 1, 17}},
    {"BlockBelowTapCount", 33, 1, {40, 5, 64}},
    {"EvenTaps", 64, 100, {1000, 999}},
};

// The three ways of building a filter that must all equal one convolution.
struct Form {
    const char* name;
    std::function<std::shared_ptr<Filter>(const Samples&, int)> make;
};

const Form kForms[] = {
    {"Created", [](const Samples& c, int block) { return FilterCreator::create(c, block); }},
    {"CreatedForFrames", [](const Samples& c, int) { return FilterCreator::createForFrames(c); }},
    {"BasicFir", [](const Samples& c, int) { return std::make_shared<BasicFir>(c); }},
    {"BlockOverBasicFir",
     [](const Samples& c, int block) {
         return std::make_shared<BlockFilter>(std::make_shared<BasicFir>(c), block);
     }},
};

class FilterAgainstConvolution : public ::testing::TestWithParam<std::tuple<int, FilterCase>> {};

TEST_P(FilterAgainstConvolution, CallsInSequenceEqualOneConvolution) {
    const Form& form = kForms[std::get<0>(GetParam())];
    const FilterCase& c = std::get<1>(GetParam());
    const Samples coefficients = randomSamples(c.taps, 1);
    const int total = std::accumulate(c.calls.begin(), c.calls.end(), 0);
    const Samples input = randomSamples(total, 2);
    const Samples expected = directConvolution(coefficients, input);

    // Span form into a separate output, and interleaved form in place, call by call.
    auto filter = form.make(coefficients, c.blockSize);
    auto inPlaceFilter = form.make(coefficients, c.blockSize);
    Samples output(total), inPlace = input;
    int offset = 0;
    for (int length : c.calls) {
        filter->filter(gsl::span<Complex>(const_cast<Complex*>(input.data()) + offset, length),
                       gsl::span<Complex>(output.data() + offset, length));
        auto* pointer = reinterpret_cast<double*>(inPlace.data() + offset);
        inPlaceFilter->filter(pointer, 2 * length, pointer, 2 * length);
        offset += length;
    }
    EXPECT_LE(maxAbsDifference(output, expected), tolerance(expected));
    EXPECT_LE(maxAbsDifference(inPlace, expected), tolerance(expected));

    // The history is the last M inputs, newest at the end.
    const Samples& history = filter->getDelayLine();
    ASSERT_EQ(history.size(), coefficients.size());
    for (int i = 0; i < c.taps; ++i) {
        const int source = total - c.taps + i;
        EXPECT_EQ(history[i], source >= 0 ? input[source] : Complex(0.0)) << "delay " << i;
    }
}

INSTANTIATE_TEST_SUITE_P(Cases, FilterAgainstConvolution,
                         ::testing::Combine(::testing::Range(0, 4),
                                            ::testing::ValuesIn(kFilterCases)),
                         [](const auto& info) {
                             return std::string(kForms[std::get<0>(info.param)].name) + "_" +
                                    std::get<1>(info.param).name;
                         });

// One case per check a caller can run into.
TEST(FilterFailures, AreInvalidArguments) {
    Samples x(20), y(20);
    EXPECT_THROW(FilterCreator::create({}, 7000), std::invalid_argument);
    EXPECT_THROW(FilterCreator::createForFrames({}), std::invalid_argument);
    EXPECT_THROW(Fir(std::make_shared<IppDft>(4), Samples(5)), std::invalid_argument);
    Fir fir(std::make_shared<IppDft>(16), Samples(5, Complex(1.0)));
    EXPECT_THROW(fir.filter(x.data(), 13, y.data(), 13), std::invalid_argument);  // 13 + 4 > 16
    EXPECT_THROW(fir.filter(x.data(), 4, y.data(), 5), std::invalid_argument);
    auto* interleaved = reinterpret_cast<double*>(x.data());
    EXPECT_THROW(FilterCreator::create(Samples(3, Complex(1.0)), 7000)
                     ->filter(interleaved, 7, interleaved, 7),  // odd count of doubles
                 std::invalid_argument);
    EXPECT_THROW(BlockFilter(nullptr, 10), std::invalid_argument);
}

}  // namespace
}  // namespace dsp_test
