#include "coding/constellation.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <string>

#include "test_support.h"
#include "vector_file.h"

namespace {

struct Tables {
    std::array<complex, 2> bpsk;
    std::array<complex, 4> qpsk;
    std::array<complex, 16> qam16;
    std::array<complex, 64> qam64;
    std::array<complex, 256> qam256;
    explicit Tables(bool normalise) {
        GetConstellation(bpsk.data(), qpsk.data(), qam16.data(), qam64.data(), qam256.data(),
                         normalise);
    }
    std::pair<const complex*, int> byBits(int qm) const {
        switch (qm) {
            case 1:
                return {bpsk.data(), 2};
            case 2:
                return {qpsk.data(), 4};
            case 4:
                return {qam16.data(), 16};
            case 6:
                return {qam64.data(), 64};
            default:
                return {qam256.data(), 256};
        }
    }
};

// TS 38.211 clauses 5.1.3 to 5.1.5 written out term by term for one symbol.
complex referencePoint(unsigned index, int qm) {
    auto b = [&](int i) { return 1 - 2 * static_cast<int>((index >> (qm - 1 - i)) & 1u); };
    switch (qm) {
        case 2:
            return {double(b(0)), double(b(1))};
        case 4:
            return {double(b(0) * (2 - b(2))), double(b(1) * (2 - b(3)))};
        case 6:
            return {double(b(0) * (4 - b(2) * (2 - b(4)))), double(b(1) * (4 - b(3) * (2 - b(5))))};
        default:
            return {double(b(0) * (8 - b(2) * (4 - b(4) * (2 - b(6))))),
                    double(b(1) * (8 - b(3) * (4 - b(5) * (2 - b(7)))))};
    }
}

class ConstellationOrder : public ::testing::TestWithParam<int> {};

TEST_P(ConstellationOrder, RawPointsFollowTheClauseAndNormalisedPowerIsOne) {
    const int qm = GetParam();
    const Tables raw(false), unit(true);
    const auto [points, count] = raw.byBits(qm);
    const auto [scaled, count2] = unit.byBits(qm);
    ASSERT_EQ(count, count2);
    double power = 0;
    for (int i = 0; i < count; ++i) {
        const auto index = static_cast<unsigned>(i);
        EXPECT_EQ(points[i], referencePoint(index, qm)) << "index " << i;
        power += std::norm(scaled[i]);
        EXPECT_NEAR(std::arg(scaled[i]), std::arg(points[i]), 1e-15);
    }
    EXPECT_NEAR(power / count, 1.0, 1e-12);
}

INSTANTIATE_TEST_SUITE_P(Qam, ConstellationOrder, ::testing::Values(2, 4, 6, 8),
                         [](const auto& info) { return "Qm" + std::to_string(info.param); });

TEST(Constellation, NamedPointsAndBpsk) {
    const Tables raw(false), unit(true);
    EXPECT_EQ(raw.qam16[1], complex(1, 3));
    EXPECT_EQ(raw.qam16[2], complex(3, 1));
    EXPECT_EQ(raw.qam64[0], complex(3, 3));
    EXPECT_EQ(raw.qam256[0], complex(5, 5));
    EXPECT_EQ(raw.bpsk[0], complex(1, 1));
    EXPECT_EQ(raw.bpsk[1], complex(-1, -1));
    EXPECT_NEAR(std::abs(unit.bpsk[1] - complex(-1, -1) / std::sqrt(2.0)), 0.0, 1e-15);
    EXPECT_THROW(GetConstellation(nullptr, nullptr, nullptr, nullptr, nullptr, true),
                 std::invalid_argument);
}

TEST(HalfPiBpsk, RotatesOddSymbolsAndCountsOnlyOnesAsOne) {
    const double a = 1.0 / std::sqrt(2.0);
    BitSequence bits{0, 1, 1, 0, 2, static_cast<char>(-1)};
    std::vector<complex> symbols(bits.size() + 1, complex(7, 7));
    HalfPiBPSK(bits, symbols);
    const complex j(0, 1);
    const double sign[] = {1, -1, -1, 1, 1, 1};  // 2 and -1 are not bit 1
    for (std::size_t n = 0; n < bits.size(); ++n) {
        const complex expected = sign[n] * a * complex(1, 1) * std::pow(j, static_cast<int>(n % 2));
        EXPECT_NEAR(std::abs(symbols[n] - expected), 0.0, 1e-15) << n;
    }
    EXPECT_EQ(symbols.back(), complex(7, 7));
    EXPECT_NEAR(std::abs(symbols[1] - complex(a, -a)), 0.0, 1e-15);

    BitSequence none;
    std::vector<complex> untouched(2, complex(3, 3));
    HalfPiBPSK(none, untouched);
    EXPECT_EQ(untouched[0], complex(3, 3));
    std::vector<complex> tooShort(1);
    EXPECT_THROW(HalfPiBPSK(bits, tooShort), std::out_of_range);
}

TEST(Constellation, PublishedModulationVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto path =
        nrsynth_test::sharedDir() / "testvectors" / "modulation" / "py5gphy_modulation.txt";
    const auto cases = nrsynth_test::readVectorCases(
        path.string(), [](const std::vector<std::string>& h) { return 1 + std::stoi(h.at(3)); });
    const Tables unit(true);
    int checked = 0;
    for (const auto& c : cases) {
        const std::string& type = c.header.at(0);
        const int qm = std::stoi(c.header.at(1));
        if (qm > 8) continue;  // 1024QAM is not a table of this library
        const BitSequence bits = nrsynth_test::bitsOf(c.lines.at(0));
        const int nsym = std::stoi(c.header.at(3));
        std::vector<complex> got(static_cast<std::size_t>(nsym));
        if (type == "pi/2-BPSK") {
            BitSequence copy = bits;
            HalfPiBPSK(copy, got);
        } else {
            const auto [table, count] = unit.byBits(qm);
            (void)count;
            for (int s = 0; s < nsym; ++s) {
                unsigned index = 0;
                for (int k = 0; k < qm; ++k)
                    index = (index << 1) |
                            static_cast<unsigned>(bits[static_cast<std::size_t>(s * qm + k)]);
                got[static_cast<std::size_t>(s)] = table[index];
            }
        }
        for (int s = 0; s < nsym; ++s) {
            std::istringstream words(c.lines.at(static_cast<std::size_t>(1 + s)));
            double re = 0, im = 0;
            words >> re >> im;
            EXPECT_NEAR(std::abs(got[static_cast<std::size_t>(s)] - complex(re, im)), 0.0, 1e-12)
                << type << " symbol " << s;
        }
        ++checked;
    }
    EXPECT_EQ(checked, 6);
}

}  // namespace
