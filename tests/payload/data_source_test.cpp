#include "payload/data_source.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <string>
#include <vector>

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

TEST(DataSource, Pn9BlockWrapsAfter511Bits) {
    DataSourceBlock source;
    source.Init(payload(PayloadDataType::PN9));
    ASSERT_EQ(source.length, 511);
    EXPECT_FALSE(source.generating);
    EXPECT_EQ(source.block, registerBits(9, 5, 511, false));
    const std::vector<char> first = draw(source, 500);
    EXPECT_EQ(source.position, 500);
    const std::vector<char> next = draw(source, 12);  // crosses the end: case 3
    EXPECT_EQ(source.position, 1);
    EXPECT_EQ(next[11], first[0]);  // the 512th bit equals the first
    EXPECT_EQ(std::vector<char>(next.begin(), next.begin() + 11),
              std::vector<char>(source.block.begin() + 500, source.block.end()));
}

TEST(DataSource, RequestsOfTheBlockLengthAndLongerGoBitByBit) {
    DataSourceBlock source;
    source.Init(std::vector<char>{1, 0, 0, 1, 1});
    draw(source, 2);
    EXPECT_EQ(draw(source, 5), (std::vector<char>{0, 1, 1, 1, 0}));
    EXPECT_EQ(source.position, 2);  // exactly the length: position unchanged
    EXPECT_EQ(draw(source, 12), (std::vector<char>{0, 1, 1, 1, 0, 0, 1, 1, 1, 0, 0, 1}));
    EXPECT_EQ(source.position, 4);
    EXPECT_EQ(draw(source, 0), std::vector<char>{});
    source.Reset();
    EXPECT_EQ(draw(source, 3), (std::vector<char>{1, 0, 0}));
}

TEST(DataSource, IntFormSignExtendsAndBothFormsAgree) {
    DataSourceBlock chars, ints;
    chars.Init(payload(PayloadDataType::Pattern, "01/1"));  // '/' - '0' is -1, kept unchecked
    ints.Init(payload(PayloadDataType::Pattern, "01/1"));
    std::vector<int> out(10, 7);
    ints.GetOneFrame(out, 9);
    const std::vector<char> c = draw(chars, 9);
    for (int i = 0; i < 9; ++i)
        EXPECT_EQ(out[static_cast<std::size_t>(i)],
                  static_cast<int>(c[static_cast<std::size_t>(i)]));
    EXPECT_EQ(out[2], -1);
    EXPECT_EQ(out[9], 7);  // past count: untouched
}

TEST(DataSource, StoredPn15AndPn23) {
    DataSourceBlock pn15, pn23;
    pn15.Init(payload(PayloadDataType::PN15));
    pn23.Init(payload(PayloadDataType::PN23));
    EXPECT_EQ(pn15.length, 32767);
    EXPECT_EQ(pn23.length, 0x7fffff);
    EXPECT_EQ(pn15.block, registerBits(15, 14, 32767, true));
    const std::vector<char> head = registerBits(23, 18, 5000, true);
    EXPECT_TRUE(std::equal(head.begin(), head.end(), pn23.block.begin()));
}

TEST(DataSource, Pn31GeneratesAndRestartsOnReset) {
    DataSourceBlock source;
    source.Init(payload(PayloadDataType::PN31));
    EXPECT_TRUE(source.generating);
    EXPECT_EQ(source.length, 0x7fffffff);
    EXPECT_TRUE(source.block.empty());
    const std::vector<char> expected = registerBits(31, 28, 300, true);
    std::vector<char> got = draw(source, 100);
    const std::vector<char> more = draw(source, 200);
    got.insert(got.end(), more.begin(), more.end());
    EXPECT_EQ(got, expected);
    source.Reset();
    EXPECT_EQ(draw(source, 100), std::vector<char>(expected.begin(), expected.begin() + 100));
    source.Reset();
    // Fewer bits than the degree: the generator's short path, not complemented.
    EXPECT_EQ(draw(source, 10), registerBits(31, 28, 10, false));
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

    source.Init(payload(PayloadDataType::Pattern, "PN23(17)"));
    EXPECT_TRUE(source.block.empty());
    EXPECT_THROW(draw(source, 4), std::invalid_argument);  // empty block
    EXPECT_THROW(source.Init(payload(PayloadDataType::Pattern, "PN23(,5)")), std::invalid_argument);
    EXPECT_THROW(source.Init(payload(PayloadDataType::Pattern, "PN23(99999999999:1)")),
                 std::invalid_argument);  // index beyond int: refused with the pattern named
}

class UserFileTest : public ::testing::Test {
  protected:
    std::filesystem::path dir_;
    void SetUp() override {
        dir_ = std::filesystem::temp_directory_path() /
               ("nrsynth_payload_" +
                std::to_string(::testing::UnitTest::GetInstance()->random_seed()) + "_" +
                ::testing::UnitTest::GetInstance()->current_test_info()->name());
        std::filesystem::create_directories(dir_);
    }
    void TearDown() override { std::filesystem::remove_all(dir_); }
    std::string write(const std::string& name, const std::string& content) {
        const auto path = dir_ / name;
        std::ofstream(path, std::ios::binary) << content;
        return path.string();
    }
    std::vector<char> load(const std::string& path) {
        DataSourceBlock source;
        source.Init(payload(PayloadDataType::UserFile, "", path));
        EXPECT_EQ(source.length, static_cast<int>(source.block.size()));
        return source.block;
    }
};

TEST_F(UserFileTest, TextAndBinaryForms) {
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
    for (const auto& c : cases) EXPECT_EQ(load(write(c.name, c.content)), c.bits) << c.name;
}

TEST_F(UserFileTest, MissingFileIsAFailureNamingIt) {
    const std::string missing = (dir_ / "absent.txt").string();
    try {
        load(missing);
        FAIL() << "no exception";
    } catch (const std::runtime_error& e) {
        EXPECT_NE(std::string(e.what()).find(missing), std::string::npos) << e.what();
    }
    EXPECT_THROW(load(dir_.string()), std::runtime_error);  // a folder is no file either
}

TEST(DataSource, RequestsBeyondTheCallersVector) {
    DataSourceBlock source;
    source.Init(payload(PayloadDataType::PN9));
    std::vector<char> small(4);
    EXPECT_THROW(source.GetOneFrame(small, 5), std::out_of_range);
    EXPECT_THROW(source.GetOneFrame(small, -1), std::out_of_range);
    source.position = 600;
    EXPECT_THROW(source.GetOneFrame(small, 2), std::out_of_range);
}

}  // namespace
