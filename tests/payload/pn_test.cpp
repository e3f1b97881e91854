#include "payload/pn.h"

#include <gtest/gtest.h>

#include <map>
#include <vector>

namespace {

using Orvalis_NR::PN;

// The exponents of the generator polynomials, degree 3..31, as tabulated for the PN payloads.
std::vector<int> exponents(int degree) {
    static const std::map<int, std::vector<int>> table = {
        {3, {3, 1}},         {4, {4, 1}},          {5, {5, 2}},         {6, {6, 1}},
        {7, {7, 1}},         {8, {8, 4, 3, 2}},    {9, {9, 5}},         {10, {10, 3}},
        {11, {11, 9}},       {12, {12, 6, 4, 1}},  {13, {13, 4, 3, 1}}, {14, {14, 12, 2, 1}},
        {15, {15, 14}},      {16, {16, 12, 3, 1}}, {17, {17, 3}},       {18, {18, 7}},
        {19, {19, 5, 2, 1}}, {20, {20, 3}},        {21, {21, 2}},       {22, {22, 1}},
        {23, {23, 18}},      {24, {24, 7, 2}},     {25, {25, 3}},       {26, {26, 6, 2, 1}},
        {27, {27, 5, 2, 1}}, {28, {28, 3}},        {29, {29, 27}},      {30, {30, 23, 2, 1}},
        {31, {31, 28}}};
    return table.at(degree);
}

// A shift register of as many cells as the first exponent, all ones at start; out comes the
// oldest cell (complemented on request), in goes the sum of the cells the exponents name.
struct ReferenceRegister {
    std::vector<int> exps;
    std::vector<char> cells = std::vector<char>(static_cast<std::size_t>(exps.front()), 1);
    std::vector<char> take(int n, bool complement = false) {
        std::vector<char> bits;
        for (int i = 0; i < n; ++i) {
            bits.push_back(static_cast<char>(cells.front() ^ complement));
            char feedback = 0;
            for (int t : exps) feedback ^= cells[cells.size() - static_cast<std::size_t>(t)];
            cells.erase(cells.begin());
            cells.push_back(feedback);
        }
        return bits;
    }
};

bool isInverted(int degree) {
    return degree == 15 || degree == 23 || degree == 29 || degree == 31;
}

class PnDegree : public ::testing::TestWithParam<int> {};

TEST_P(PnDegree, SuccessiveCallsFollowTheRegisterWithoutGaps) {
    const int degree = GetParam();
    PN pn;
    std::vector<char> seed;
    pn.Init(degree, seed, 0);
    EXPECT_EQ(seed, std::vector<char>(static_cast<std::size_t>(degree), 1));
    ReferenceRegister reference{exponents(degree)};
    for (int count : {degree, 2 * degree + 3, 1000, degree + 1}) {
        std::vector<char> bits;
        pn.Generate(bits, count);
        ASSERT_EQ(bits, reference.take(count, isInverted(degree))) << "count=" << count;
    }
}

INSTANTIATE_TEST_SUITE_P(AllDegrees, PnDegree, ::testing::Range(3, 32));

TEST(Pn, MaximalLengthPeriods) {
    // Degrees 3 to 23: the all-ones window comes back after exactly 2^degree - 1 bits and not
    // before, so the period is maximal. (The degree-24 polynomial has an even number of terms
    // and is not primitive, so it is left out.)
    for (int degree = 3; degree <= 23; ++degree) {
        const int period = (1 << degree) - 1;
        PN pn;
        std::vector<char> seed;
        pn.Init(degree, seed, 0);
        const std::vector<char> bits = pn.Generate(period + degree);
        const char one = isInverted(degree) ? 0 : 1;
        int run = 0, firstRepeat = -1;
        for (int i = 1; i < period + degree && firstRepeat < 0; ++i) {
            run = bits[static_cast<std::size_t>(i)] == one ? run + 1 : 0;
            if (i >= degree && run >= degree) firstRepeat = i - degree + 1;
        }
        EXPECT_EQ(firstRepeat, period) << "degree " << degree;
    }
}

TEST(Pn, UnknownDegreesAreNineAndGivenPolynomialsAreUsed) {
    PN pn;
    std::vector<char> seed;
    for (int degree : {2, 32}) {
        pn.Init(degree, seed, 0);
        EXPECT_EQ(pn.Generate(100), (ReferenceRegister{{9, 5}}.take(100))) << degree;
    }
    pn.Init(7, seed, std::vector<char>{7, 3}, 0);  // instead of the table's x^7 + x + 1
    EXPECT_EQ(pn.Generate(50), (ReferenceRegister{{7, 3}}.take(50)));
    EXPECT_THROW(pn.Init(7, seed, std::vector<char>{8, 1}, 0), std::invalid_argument);
}

TEST(Pn, SkipDropsBitsOnceAndShortRequestsAreNotComplemented) {
    PN pn;
    std::vector<char> seed;
    pn.Init(11, seed, 37);
    ReferenceRegister reference{exponents(11)};
    reference.take(37);
    EXPECT_EQ(pn.Generate(40), reference.take(40));
    EXPECT_EQ(pn.Generate(40), reference.take(40));

    pn.Init(15, seed, 0);
    ReferenceRegister pn15{exponents(15)};
    std::vector<char> bits;
    pn.Generate(bits, 7);  // below the degree: GenerateShort, plain register bits
    EXPECT_EQ(bits, pn15.take(7));
    pn.Generate(bits, 20);  // at or above: complemented again, continuing the sequence
    EXPECT_EQ(bits, pn15.take(20, true));
    PN fresh;
    EXPECT_THROW(fresh.Generate(bits, 10), std::logic_error);
}

}  // namespace
