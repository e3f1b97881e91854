#include "framework/tools.h"

#include <gtest/gtest.h>

namespace {

using Orvalis::Tessaline::Path;
using Orvalis::Tessaline::RunTime;
using Orvalis::Tessaline::Tools;

TEST(Tools, SplitKeepsEmptyPieces) {
    EXPECT_EQ(Tools::split("a,,b,", ','), (std::vector<std::string>{"a", "", "b", ""}));
    EXPECT_EQ(Tools::split("", ','), (std::vector<std::string>{""}));
    EXPECT_EQ(Tools::split("0:19", ':'), (std::vector<std::string>{"0", "19"}));
}

TEST(Tools, TrimReplaceAndTrimEnd) {
    EXPECT_EQ(Tools::trim("  QAM16 ", ' '), "QAM16");
    EXPECT_EQ(Tools::trim("    ", ' '), "");
    EXPECT_EQ(Tools::trimEnd("wave.bin", ".bin"), "wave");
    EXPECT_EQ(Tools::trimEnd("wave.bin", ".mkr"), "wave.bin");
    EXPECT_EQ(Tools::replace("Models::Nr5g::NRDCI", "::", "."), "Models.Nr5g.NRDCI");
    EXPECT_EQ(Tools::replace("aaa", "a", "aa"), "aaaaaa");
    EXPECT_EQ(Tools::replace("abc", "", "x"), "abc");
}

TEST(Tools, EnumTablePositions) {
    const std::string table = "Offset00, Offset01, Offset10, Offset11";
    EXPECT_EQ(Tools::textToEnumIndex(table, "Offset00"), 0);
    EXPECT_EQ(Tools::textToEnumIndex(table, "Offset11"), 3);
    EXPECT_EQ(Tools::textToEnumIndex(table, "offset11"), -1);
    EXPECT_EQ(Tools::textToEnumIndex(table, ""), -1);
    EXPECT_EQ(Tools::enumIndexToText(table, 2), "Offset10");
    // Out of range on either side is an empty text, never a crash.
    EXPECT_EQ(Tools::enumIndexToText(table, 4), "");
    EXPECT_EQ(Tools::enumIndexToText(table, -1), "");
}

TEST(Tools, PathCombineUsesOneSeparator) {
    EXPECT_EQ(Path::combine("out", "wave.bin"), "out/wave.bin");
    EXPECT_EQ(Path::combine("out/", "wave.bin"), "out/wave.bin");
    EXPECT_EQ(Path::combine("out/", "/wave.bin"), "out/wave.bin");
    EXPECT_EQ(Path::combine("", "wave.bin"), "wave.bin");
}

TEST(RunTime, ClassNamesFromSignatureText) {
    static const char msvc[] =
        "class std::basic_string<char,struct std::char_traits<char>,class std::allocator<char> > "
        "__cdecl Models::Nr5g::NRDCI::getTypeName(void) const";
    EXPECT_EQ(RunTime::doGetTypeName(msvc, sizeof msvc), "NRDCI");
    static const char msvcFull[] =
        "class std::basic_string<char,struct std::char_traits<char>,class std::allocator<char> > "
        "__cdecl Models::Nr5g::NRULSCH_RT::getFullTypeName(void) const";
    EXPECT_EQ(RunTime::doGetFullTypeName(msvcFull, sizeof msvcFull), "Models.Nr5g.NRULSCH_RT");
    static const char gcc[] =
        "virtual std::string Orvalis::Tessaline::TextModel::getFullTypeName() const";
    EXPECT_EQ(RunTime::doGetFullTypeName(gcc, sizeof gcc), "Orvalis.Tessaline.TextModel");
    EXPECT_EQ(RunTime::doGetTypeName("garbage", 8), "");
    EXPECT_EQ(RunTime::doGetTypeName(nullptr, 0), "");
}

}  // namespace
