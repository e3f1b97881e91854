#include "payload/data_source.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <fstream>
#include <string>
#include <vector>

#include "../engine/output_files.h"
#include "payload/pn.h"

namespace {

using Models::Nr5g::PayloadData;
using Models::Nr5g::PayloadDataType;
using Orvalis_NR::DataSourceBlock;

std::shared_ptr<PayloadData> payload(PayloadDataType type, const std::string& pattern = "",
                                     const std::string& file = "") {
    auto p = std::make_shared<PayloadData>();
    p->PayLoadDataType->setValue(type);
    p->PatternBits->setValue(pattern);
    p->UserFile->setValue(file);
    return p;
}

// Plain shift register of the PN payloads, for the degrees used here.
std::vector<char> registerBits(int degree, int tap, int n, bool invert) {
    std::vector<char> cells(static_cast<std::size_t>(degree), 1), out;
    for (int i = 0; i < n; ++i) {
        out.push_back(static_cast<char>(cells[0] ^ (invert ? 1 : 0)));
        const char fb = static_cast<char>(cells[0] ^ cells[static_cast<std::size_t>(degree - tap)]);
        cells.erase(cells.begin());
        cells.push_back(fb);
    }
    return out;
}

std::vector<char> draw(DataSourceBlock& source, int count) {
    std::vector<char> bits(static_cast<std::size_t>(count), 9);
    source.GetOneFrame(bits, count);
    return bits;
}

struct PnCase {
    PayloadDataType type;
    int degree, tap, length;
};

class PnPayload : public ::testing::TestWithParam<PnCase> {};

// Successive draws follow the register; the short periods are drawn in full and then across
// their end, which must continue with the register's next period. Degrees 15 and up are sent
// complemented, except PN31 draws shorter than the degree (the generator's short path).
TEST_P(PnPayload, FollowsTheRegisterAcrossCallsWrapsAndRestartsOnReset) {
    const PnCase& c = GetParam();
    const bool inverted = c.degree >= 15;
    DataSourceBlock source;
    source.Init(payload(c.type));
    ASSERT_EQ(source.length, c.length);
    const bool wraps = c.length < 40000;
    const std::vector<int> calls =
        wraps ? std::vector<int>{100, c.length - 105, 12} : std::vector<int>{100, 4900};
    std::vector<char> got;
    for (int count : calls) {
        const std::vector<char> bits = draw(source, count);
        got.insert(got.end(), bits.begin(), bits.end());
    }
    const std::vector<char> expected =
        registerBits(c.degree, c.tap, wraps ? c.length + 7 : 5000, inverted);
    EXPECT_EQ(got, expected);
    source.Reset();
    EXPECT_EQ(draw(source, 100), std::vector<char>(expected.begin(), expected.begin() + 100));
    source.Reset();
    EXPECT_EQ(draw(source, 8),
              registerBits(c.degree, c.tap, 8, inverted && c.type != PayloadDataType::PN31));
}

INSTANTIATE_TEST_SUITE_P(Types, PnPayload,
                         ::testing::Values(PnCase{PayloadDataType::PN9, 9, 5, 511},
                                           PnCase{PayloadDataType::PN15, 15, 14, 32767},
                                           PnCase{PayloadDataType::PN23, 23, 18, 0x7fffff},
                                           PnCase{PayloadDataType::PN31, 31, 28, 0x7fffffff}));

// Packed draws hand out the bits the per-bit draws give, interleaved with them on one source:
// odd lengths, word boundaries, wraps of the short periods (several within one word for a
// tiny pattern) and a request longer than the block.
TEST(DataSource, PackedDrawsFollowTheBitDraws) {
    struct Case {
        std::shared_ptr<PayloadData> settings;
        std::vector<int> counts;
    };
    const std::vector<Case> cases = {
        {payload(PayloadDataType::PN9), {63, 64, 65, 448, 511, 1, 1030, 7, 3000}},
        {payload(PayloadDataType::PN15), {100, 32600, 640, 9}},
        {payload(PayloadDataType::PN23), {8424, 65, 129, 450984}},
        {payload(PayloadDataType::PN31), {40, 5, 1000, 64}},
        {payload(PayloadDataType::Pattern, "10011"), {3, 64, 130, 1}},
        {payload(PayloadDataType::Pattern, "PN23(5:104, 300:440)"), {70, 241, 500}},
    };
    for (const auto& c : cases) {
        DataSourceBlock packed, plain;
        packed.Init(c.settings);
        plain.Init(c.settings);
        for (std::size_t k = 0; k < 2 * c.counts.size(); ++k) {
            const int count = c.counts[k % c.counts.size()];
            const std::vector<char> expected = draw(plain, count);
            if (k % 3 == 2) {  // a per-bit draw on the packed source too
                EXPECT_EQ(draw(packed, count), expected);
                continue;
            }
            std::vector<std::uint64_t> words((static_cast<std::size_t>(count) + 63) / 64, ~std::uint64_t{0});
            ASSERT_TRUE(packed.GetPackedFrame(words.data(), count));
            for (int i = 0; i < 64 * static_cast<int>(words.size()); ++i)
                ASSERT_EQ((words[static_cast<std::size_t>(i / 64)] >> (i % 64)) & 1u,
                          i < count ? static_cast<unsigned>(expected[static_cast<std::size_t>(i)]) : 0u)
                    << "draw " << k << " bit " << i;
        }
        EXPECT_EQ(packed.position, plain.position);
    }
    // Digits other than 0 and 1 have no packed form and draw nothing.
    DataSourceBlock digits;
    digits.Init(payload(PayloadDataType::Pattern, "0120"));
    std::uint64_t word = 0;
    EXPECT_FALSE(digits.GetPackedFrame(&word, 3));
    EXPECT_EQ(digits.position, 0);
}

TEST(DataSource, RequestsOfTheBlockLengthAndLongerGoBitByBit) {
    DataSourceBlock source;
    source.Init(std::vector<char>{1, 0, 0, 1, 1});
    draw(source, 2);
    EXPECT_EQ(draw(source, 5), (std::vector<char>{0, 1, 1, 1, 0}));
    EXPECT_EQ(source.position, 2);  // exactly the length: position unchanged
    EXPECT_EQ(draw(source, 12), (std::vector<char>{0, 1, 1, 1, 0, 0, 1, 1, 1, 0, 0, 1}));
    source.Reset();
    EXPECT_EQ(draw(source, 3), (std::vector<char>{1, 0, 0}));
}

TEST(DataSource, Pn23PatternCutsPiecesOutOfTheSequence) {
    const std::vector<char> pn23 = Orvalis_NR::StoredPnSequence(23, 0x7fffff);
    DataSourceBlock source;
    source.Init(payload(PayloadDataType::Pattern, "PN23(0:99, 200:299)"));
    ASSERT_EQ(source.length, 200);
    EXPECT_TRUE(std::equal(pn23.begin(), pn23.begin() + 100, source.block.begin()));
    EXPECT_TRUE(std::equal(pn23.begin() + 200, pn23.begin() + 300, source.block.begin() + 100));

    source.Init(
        payload(PayloadDataType::Pattern, "PN23(8388600:8388610,9:5,3:3)"));  // wraps; 9:5 ignored
    std::vector<char> expected(pn23.begin() + 8388600, pn23.end());
    expected.insert(expected.end(), pn23.begin(), pn23.begin() + 4);
    expected.push_back(pn23[3]);
    EXPECT_EQ(source.block, expected);

    EXPECT_THROW(source.Init(payload(PayloadDataType::Pattern, "PN23(99999999999:1)")),
                 std::invalid_argument);  // index beyond int: refused with the pattern named
}

TEST(DataSource, UserFilesInTextAndBinaryForms) {
    struct Case {
        const char* name;
        std::string content;
        std::vector<char> bits;
    };
    const Case cases[] = {
        {"hex.txt", "X0F", {0, 0, 0, 0, 1, 1, 1, 1}},
        {"hex.csv", "xa1g", {1, 0, 1, 0, 0, 0, 0, 1, 0, 0, 0, 0}},  // g is no hex digit: 0
        {"bits.txt", "0110\n01", {0, 1, 1, 0, 1, 0, 1}},            // the line end is a 1
        {"bits.csv", "0,1", {0, 1, 1}},
        {"empty.txt", "", {}},
        {"data.bin", std::string("\xA5\x01", 2), {1, 0, 1, 0, 0, 1, 0, 1, 0, 0, 0, 0, 0, 0, 0, 1}},
        {"upper.TXT", "X", {0, 1, 0, 1, 1, 0, 0, 0}},  // only ".txt" and ".csv" are text
    };
    nrsynth_test::ScratchFolder folder;
    for (const auto& c : cases) {
        std::ofstream(folder.file(c.name), std::ios::binary) << c.content;
        DataSourceBlock source;
        source.Init(payload(PayloadDataType::UserFile, "", folder.file(c.name)));
        EXPECT_EQ(source.block, c.bits) << c.name;
        EXPECT_EQ(source.length, static_cast<int>(c.bits.size())) << c.name;
    }

    // A file that cannot be opened is a failure naming it.
    const std::string missing = folder.file("absent.txt");
    try {
        DataSourceBlock().Init(payload(PayloadDataType::UserFile, "", missing));
        FAIL() << "no exception";
    } catch (const std::runtime_error& e) {
        EXPECT_NE(std::string(e.what()).find(missing), std::string::npos) << e.what();
    }
}

}  // namespace
