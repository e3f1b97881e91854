#include "payload/pn.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace {

using Orvalis_NR::PN;

// The exponents of the generator polynomials, degree 3..31, as tabulated for the PN payloads.
std::vector<int> exponents(int degree) {
    switch (degree) {
        case 3:
            return {3, 1};
        case 4:
            return {4, 1};
        case 5:
            return {5, 2};
        case 6:
            return {6, 1};
        case 7:
            return {7, 1};
        case 8:
            return {8, 4, 3, 2};
        case 10:
            return {10, 3};
        case 11:
            return {11, 9};
        case 12:
            return {12, 6, 4, 1};
        case 13:
            return {13, 4, 3, 1};
        case 14:
            return {14, 12, 2, 1};
        case 15:
            return {15, 14};
        case 16:
            return {16, 12, 3, 1};
        case 17:
            return {17, 3};
        case 18:
            return {18, 7};
        case 19:
            return {19, 5, 2, 1};
        case 20:
            return {20, 3};
        case 21:
            return {21, 2};
        case 22:
            return {22, 1};
        case 23:
            return {23, 18};
        case 24:
            return {24, 7, 2};
        case 25:
            return {25, 3};
        case 26:
            return {26, 6, 2, 1};
        case 27:
            return {27, 5, 2, 1};
        case 28:
            return {28, 3};
        case 29:
            return {29, 27};
        case 30:
            return {30, 23, 2, 1};
        case 31:
            return {31, 28};
        default:
            return {9, 5};
    }
}

// A shift register of `degree` cells, all ones at start; out comes the oldest cell.
class ReferenceRegister {
  public:
    explicit ReferenceRegister(int degree)
        : degree_(degree), cells_(static_cast<std::size_t>(degree), 1), exps_(exponents(degree)) {}
    char next() {
        const char out = cells_.front();
        char feedback = 0;
        for (int t : exps_) feedback ^= cells_[static_cast<std::size_t>(degree_ - t)];
        cells_.erase(cells_.begin());
        cells_.push_back(feedback);
        return out;
    }
    std::vector<char> take(int n) {
        std::vector<char> bits;
        for (int i = 0; i < n; ++i) bits.push_back(next());
        return bits;
    }

  private:
    int degree_;
    std::vector<char> cells_;
    std::vector<int> exps_;
};

bool isInverted(int degree) {
    return degree == 15 || degree == 23 || degree == 29 || degree == 31;
}

std::vector<char> complemented(std::vector<char> bits) {
    for (auto& b : bits) b ^= 1;
    return bits;
}

class PnDegree : public ::testing::TestWithParam<int> {};

TEST_P(PnDegree, SuccessiveCallsFollowTheRegisterWithoutGaps) {
    const int degree = GetParam();
    PN pn;
    std::vector<char> seed;
    pn.Init(degree, seed, 0);
    EXPECT_EQ(seed, std::vector<char>(static_cast<std::size_t>(degree), 1));
    EXPECT_EQ(pn.inverted, isInverted(degree) ? 1 : 0);
    ReferenceRegister reference(degree);
    for (int count : {degree, 2 * degree + 3, 1000, degree + 1}) {
        std::vector<char> bits;
        pn.Generate(bits, count);
        std::vector<char> expected = reference.take(count);
        if (isInverted(degree)) expected = complemented(expected);
        ASSERT_EQ(bits, expected) << "count=" << count;
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
    for (int degree : {-1, 0, 2, 32, 100}) {
        PN pn;
        std::vector<char> seed;
        pn.Init(degree, seed, 0);
        EXPECT_EQ(pn.degree, 9);
        EXPECT_EQ(pn.Generate(100), ReferenceRegister(9).take(100)) << degree;
    }
    PN custom;
    std::vector<char> seed;
    custom.Init(9, seed, std::vector<char>{9, 5}, 0);
    EXPECT_EQ(custom.Generate(600), ReferenceRegister(9).take(600));
    PN other;
    other.Init(7, seed, std::vector<char>{7, 3}, 0);  // x^7 + x^3 + 1
    std::vector<char> reg(7, 1), expected;
    for (int i = 0; i < 50; ++i) {
        expected.push_back(reg[0]);
        const char fb = static_cast<char>(reg[0] ^ reg[4]);
        reg.erase(reg.begin());
        reg.push_back(fb);
    }
    EXPECT_EQ(other.Generate(50), expected);
    EXPECT_THROW(other.Init(7, seed, std::vector<char>{8, 1}, 0), std::invalid_argument);
    EXPECT_THROW(other.Init(7, seed, std::vector<char>{7, 0}, 0), std::invalid_argument);
}

TEST(Pn, SkipDropsBitsOnce) {
    PN pn;
    std::vector<char> seed;
    pn.Init(11, seed, 37);
    ReferenceRegister reference(11);
    reference.take(37);
    EXPECT_EQ(pn.Generate(40), reference.take(40));
    EXPECT_EQ(pn.skip, 0);
    EXPECT_EQ(pn.Generate(40), reference.take(40));
}

TEST(Pn, ShortRequestsAreNotComplemented) {
    PN pn;
    std::vector<char> seed;
    pn.Init(15, seed, 0);
    ReferenceRegister reference(15);
    std::vector<char> bits;
    pn.Generate(bits, 7);  // below the degree: GenerateShort, plain register bits
    EXPECT_EQ(bits, reference.take(7));
    EXPECT_EQ(pn.scratchLength, 7 + 15);
    pn.Generate(bits, 20);  // at or above: complemented again, continuing the sequence
    EXPECT_EQ(bits, complemented(reference.take(20)));
    pn.GenerateShort(bits, 0);
    EXPECT_TRUE(bits.empty());
    EXPECT_THROW(pn.GenerateShort(bits, 15), std::invalid_argument);
    EXPECT_THROW(pn.Generate(bits, -1), std::invalid_argument);
    PN fresh;
    EXPECT_THROW(fresh.Generate(bits, 10), std::logic_error);
}

}  // namespace
