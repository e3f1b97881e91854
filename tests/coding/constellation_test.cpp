#include "coding/constellation.h"

#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <vector>

#include "vector_file.h"

namespace {

// The five tables side by side, indexed by the bits per symbol Qm (1, 2, 4, 6, 8).
struct Tables {
    std::vector<complex> points[9];
    explicit Tables(bool normalise) {
        for (int qm : {1, 2, 4, 6, 8}) points[qm].resize(std::size_t{1} << qm);
        GetConstellation(points[1].data(), points[2].data(), points[4].data(), points[6].data(),
                         points[8].data(), normalise);
    }
};

// TS 38.211 clauses 5.1.2 to 5.1.5 written out term by term for one symbol.
complex referencePoint(unsigned index, int qm) {
    auto b = [&](int i) { return 1.0 - 2 * static_cast<int>((index >> (qm - 1 - i)) & 1u); };
    switch (qm) {
        case 1:
            return {b(0), b(0)};
        case 2:
            return {b(0), b(1)};
        case 4:
            return {b(0) * (2 - b(2)), b(1) * (2 - b(3))};
        case 6:
            return {b(0) * (4 - b(2) * (2 - b(4))), b(1) * (4 - b(3) * (2 - b(5)))};
        default:
            return {b(0) * (8 - b(2) * (4 - b(4) * (2 - b(6)))),
                    b(1) * (8 - b(3) * (4 - b(5) * (2 - b(7))))};
    }
}

class ConstellationOrder : public ::testing::TestWithParam<int> {};

TEST_P(ConstellationOrder, RawPointsFollowTheClauseAndNormalisedPowerIsOne) {
    const int qm = GetParam();
    const Tables rawTables(false), unitTables(true);
    const auto& raw = rawTables.points[qm];
    const auto& unit = unitTables.points[qm];
    double power = 0;
    for (std::size_t i = 0; i < raw.size(); ++i) {
        EXPECT_EQ(raw[i], referencePoint(static_cast<unsigned>(i), qm)) << "index " << i;
        power += std::norm(unit[i]);
        EXPECT_NEAR(std::arg(unit[i]), std::arg(raw[i]), 1e-15);
    }
    EXPECT_NEAR(power / static_cast<double>(raw.size()), 1.0, 1e-12);
}

INSTANTIATE_TEST_SUITE_P(Qam, ConstellationOrder, ::testing::Values(1, 2, 4, 6, 8),
                         [](const auto& info) { return "Qm" + std::to_string(info.param); });

TEST(Constellation, NullTableIsRefused) {
    EXPECT_THROW(GetConstellation(nullptr, nullptr, nullptr, nullptr, nullptr, true),
                 std::invalid_argument);
}

TEST(HalfPiBpsk, RotatesOddSymbolsAndCountsOnlyOnesAsOne) {
    const double a = 1.0 / std::sqrt(2.0);
    BitSequence bits{0, 1, 1, 0, 2, static_cast<char>(-1)};
    std::vector<complex> symbols(bits.size() + 1, complex(7, 7));
    HalfPiBPSK(bits, symbols);
    const double sign[] = {1, -1, -1, 1, 1, 1};  // 2 and -1 are not bit 1
    for (std::size_t n = 0; n < bits.size(); ++n) {
        const complex expected = sign[n] * a * complex(1, 1) * (n % 2 ? complex(0, 1) : 1.0);
        EXPECT_NEAR(std::abs(symbols[n] - expected), 0.0, 1e-15) << n;
    }
    EXPECT_EQ(symbols.back(), complex(7, 7));
    std::vector<complex> tooShort(1);
    EXPECT_THROW(HalfPiBPSK(bits, tooShort), std::out_of_range);
}

TEST(Constellation, PublishedModulationVectors) {
    NRSYNTH_REQUIRE_SHARED();
    const auto cases = nrsynth_test::readVectorCases(
        "modulation/py5gphy_modulation.txt",
        [](const std::vector<std::string>& h) { return 1 + std::stoi(h.at(3)); });
    const Tables unit(true);
    int checked = 0;
    for (const auto& c : cases) {
        const std::string& type = c.header.at(0);
        const int qm = std::stoi(c.header.at(1));
        if (qm > 8) continue;  // 1024QAM is not a table of this library
        BitSequence bits = nrsynth_test::bitsOf(c.lines.at(0));
        const auto nsym = static_cast<std::size_t>(std::stoi(c.header.at(3)));
        std::vector<complex> got(nsym);
        if (type == "pi/2-BPSK") {
            HalfPiBPSK(bits, got);
        } else {
            for (std::size_t s = 0; s < nsym; ++s) {
                unsigned index = 0;
                for (std::size_t k = 0; k < static_cast<std::size_t>(qm); ++k)
                    index = (index << 1) | static_cast<unsigned>(bits[s * qm + k]);
                got[s] = unit.points[qm][index];
            }
        }
        for (std::size_t s = 0; s < nsym; ++s)
            EXPECT_NEAR(std::abs(got[s] - nrsynth_test::complexOf(c.lines.at(1 + s))), 0.0, 1e-12)
                << type << " symbol " << s;
        ++checked;
    }
    EXPECT_EQ(checked, 6);
}

}  // namespace
