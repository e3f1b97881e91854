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
    {"BasicFir", [](const Samples& c, int) { return std::make_shared<BasicFir>(c); }},
    {"BlockOverBasicFir",
     [](const Samples& c, int block) {
         return std::make_shared<BlockFilter>(std::make_shared<BasicFir>(c), block);
     }},
};

class FilterAgainstConvolution : public ::testing::TestWithParam<std::tuple<int, FilterCase>> {
  protected:
    const Form& form() const { return kForms[std::get<0>(GetParam())]; }
    const FilterCase& filterCase() const { return std::get<1>(GetParam()); }
};

TEST_P(FilterAgainstConvolution, CallsInSequenceEqualOneConvolution) {
    const FilterCase& c = filterCase();
    const Samples coefficients = randomSamples(c.taps, 1);
    const int total = std::accumulate(c.calls.begin(), c.calls.end(), 0);
    const Samples input = randomSamples(total, 2);
    const Samples expected = directConvolution(coefficients, input);

    auto filter = form().make(coefficients, c.blockSize);
    Samples output(total);
    int offset = 0;
    for (int length : c.calls) {
        filter->filter(gsl::span<Complex>(const_cast<Complex*>(input.data()) + offset, length),
                       gsl::span<Complex>(output.data() + offset, length));
        offset += length;
    }
    EXPECT_LE(maxAbsDifference(output, expected), tolerance(expected));

    // The history is the last M inputs, newest at the end.
    const Samples& history = filter->getDelayLine();
    ASSERT_EQ(history.size(), coefficients.size());
    for (int i = 0; i < c.taps; ++i) {
        const int source = total - c.taps + i;
        EXPECT_EQ(history[i], source >= 0 ? input[source] : Complex(0.0)) << "delay " << i;
    }
    EXPECT_EQ(filter->getCoefficients(), coefficients);
}

TEST_P(FilterAgainstConvolution, InPlaceInterleavedFilteringGivesTheSame) {
    const FilterCase& c = filterCase();
    const Samples coefficients = randomSamples(c.taps, 3);
    const int total = std::accumulate(c.calls.begin(), c.calls.end(), 0);
    Samples data = randomSamples(total, 4);
    const Samples expected = directConvolution(coefficients, data);

    auto filter = form().make(coefficients, c.blockSize);
    int offset = 0;
    for (int length : c.calls) {
        auto* pointer = reinterpret_cast<double*>(data.data() + offset);
        filter->filter(pointer, 2 * length, pointer, 2 * length);
        offset += length;
    }
    EXPECT_LE(maxAbsDifference(data, expected), tolerance(expected));
}

INSTANTIATE_TEST_SUITE_P(Cases, FilterAgainstConvolution,
                         ::testing::Combine(::testing::Range(0, 3),
                                            ::testing::ValuesIn(kFilterCases)),
                         [](const auto& info) {
                             return std::string(kForms[std::get<0>(info.param)].name) + "_" +
                                    std::get<1>(info.param).name;
                         });

struct SizingCase {
    int taps;
    int blockSize;
    int expectedBlock;
    int expectedTransform;
};

class FilterCreatorSizing : public ::testing::TestWithParam<SizingCase> {};

TEST_P(FilterCreatorSizing, BlockIsAtLeastTheTapCountAndTransformThePowerOfTwoAbove) {
    const SizingCase& c = GetParam();
    auto created = FilterCreator::create(Samples(c.taps, Complex(1.0)), c.blockSize);
    EXPECT_EQ(created->blockSize, c.expectedBlock);
    auto fir = std::dynamic_pointer_cast<Fir>(created->inner);
    ASSERT_TRUE(fir);
    EXPECT_EQ(fir->transform->size(), c.expectedTransform);
}

INSTANTIATE_TEST_SUITE_P(
    Cases, FilterCreatorSizing,
    ::testing::Values(SizingCase{1025, 7000, 7000, 8192}, SizingCase{1024, 7000, 7000, 8192},
                      SizingCase{1, 7000, 7000, 8192}, SizingCase{3000, 100, 3000, 8192},
                      SizingCase{1, 1, 1, 1}, SizingCase{2, 1, 2, 4},
                      SizingCase{4096, 4097, 4097, 8192}, SizingCase{4096, 4098, 4098, 16384},
                      SizingCase{3, -5, 3, 8}));

TEST(OverlapSaveLength, StopsItsSearchAt0x800000) {
    EXPECT_EQ(Orvalis_NR::overlapSaveLength(5), 8);
    EXPECT_EQ(Orvalis_NR::overlapSaveLength(8192), 8192);
    EXPECT_EQ(Orvalis_NR::overlapSaveLength(8193), 16384);
    EXPECT_EQ(Orvalis_NR::overlapSaveLength(0x800000), 0x800000);
    EXPECT_EQ(Orvalis_NR::overlapSaveLength(0x800001), 0x800000);
    EXPECT_EQ(Orvalis_NR::overlapSaveLength(1LL << 40), 0x800000);
}

TEST(Fir, RebuildsItsSpectrumWhenTheTransformIsResized) {
    const Samples coefficients = randomSamples(9, 5);
    const Samples input = randomSamples(120, 6);
    const Samples expected = directConvolution(coefficients, input);
    auto transform = std::make_shared<IppDft>(16);
    Fir fir(transform, coefficients);
    Samples output(120);
    fir.filter(input.data(), 8, output.data(), 8);
    transform->resize(100);  // not a power of two: the general transform takes over
    fir.filter(input.data() + 8, 92, output.data() + 8, 92);
    transform->resize(64);
    fir.filter(input.data() + 100, 20, output.data() + 100, 20);
    EXPECT_LE(maxAbsDifference(output, expected), tolerance(expected));
}

void expectInvalid(const std::function<void()>& call, const char* text) {
    try {
        call();
        ADD_FAILURE() << "no exception, expected \"" << text << "\"";
    } catch (const std::invalid_argument& e) {
        EXPECT_STREQ(e.what(), text);
    }
}

TEST(FilterFailures, CarryTheirTexts) {
    Samples x(20), y(20);
    expectInvalid([] { FilterCreator::create({}, 7000); }, "coeff");
    expectInvalid([] { BasicFir fir(Samples{}); }, "m_coeff");
    expectInvalid([] { Fir fir(std::make_shared<IppDft>(4), Samples(5)); }, "m_coeff");

    Fir fir(std::make_shared<IppDft>(16), Samples(5, Complex(1.0)));
    expectInvalid([&] { fir.filter(x.data(), 13, y.data(), 13); }, "dft");
    EXPECT_NO_THROW(fir.filter(x.data(), 12, y.data(), 12));
    expectInvalid([&] { fir.filter(x.data(), 4, y.data(), 5); }, "iqInputLength");
    expectInvalid([&] { fir.filter(x.data(), 0, y.data(), 0); }, "iqInputLength");

    auto block = FilterCreator::create(Samples(3, Complex(1.0)), 7000);
    expectInvalid([&] { block->filter(x.data(), 4, y.data(), 3); }, "iqInputLength");
    expectInvalid([&] { block->filter(gsl::span<Complex>(), gsl::span<Complex>()); },
                  "iqInputLength");

    auto* xd = reinterpret_cast<double*>(x.data());
    auto* yd = reinterpret_cast<double*>(y.data());
    expectInvalid([&] { block->filter(xd, 7, yd, 7); }, "inputLength");
    expectInvalid([&] { block->filter(xd, 8, yd, 6); }, "inputLength");
    expectInvalid([&] { block->filter(xd, 0, yd, 0); }, "inputLength");

    EXPECT_THROW(BlockFilter(nullptr, 10), std::invalid_argument);
    EXPECT_THROW(BlockFilter(std::make_shared<BasicFir>(Samples(1)), 0), std::invalid_argument);
    EXPECT_THROW(Fir(nullptr, Samples(1)), std::invalid_argument);
}

}  // namespace
}  // namespace dsp_test
