// Documents that no real waveform needs, which would otherwise exhaust a host's stack or
// memory: they are refused with a message before the tree is built.

#include <gtest/gtest.h>
#include <pthread.h>

#include <string>

#include "framework/json_serializer.h"
#include "models/all_models.h"

namespace {

using Orvalis::Tessaline::DeserializeError;
using Orvalis::Tessaline::JsonSerializer;

std::string errorOf(const std::string& json) {
    try {
        JsonSerializer().deserialize(json);
    } catch (const DeserializeError& e) {
        return e.what();
    }
    return "(no error)";
}

std::string nested(const std::string& key, int depth, const std::string& inner = "") {
    return "{\"" + key + "\": " + std::string(depth, '[') + inner + std::string(depth, ']') + "}";
}

std::string items(const std::string& key, std::size_t count) {
    std::string doc = "{\"" + key + "\": [";
    for (std::size_t i = 0; i < count; ++i) doc += i ? ",{}" : "{}";
    return doc + "]}";
}

// Runs `body` on a thread with a 256 KB stack, the size a host may well give its workers.
template <class Body>
void onSmallStack(Body body) {
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    pthread_attr_setstacksize(&attributes, 256 * 1024);
    pthread_t thread;
    auto run = [](void* arg) -> void* {
        (*static_cast<Body*>(arg))();
        return nullptr;
    };
    ASSERT_EQ(pthread_create(&thread, &attributes, run, &body), 0);
    pthread_join(thread, nullptr);
    pthread_attr_destroy(&attributes);
}

struct LimitCase {
    const char* name;
    std::string json;
    std::string message;
};

class DocumentLimits : public ::testing::TestWithParam<LimitCase> {};

TEST_P(DocumentLimits, RefusedWithAMessage) {
    std::string message;
    onSmallStack([&] { message = errorOf(GetParam().json); });
    EXPECT_EQ(message, GetParam().message);
}

INSTANTIATE_TEST_SUITE_P(
    JsonReading, DocumentLimits,
    ::testing::Values(
        LimitCase{"DeepArrays", nested("NumberOfFrames", 15000),
                  "document nests deeper than 64 levels (at byte 82)"},
        LimitCase{"DeepObjectsInAnUnknownKey",
                  [] {
                      std::string doc;
                      for (int i = 0; i < 100000; ++i) doc += "{\"a\":";
                      return doc + "1" + std::string(100000, '}');
                  }(),
                  "document nests deeper than 64 levels (at byte 320)"},
        LimitCase{"BracketsInsideStringsDoNotCount",
                  "{\"WaveformName\": \"" + std::string(1000, '[') + "\\\"" +
                      std::string(1000, '{') + "\", \"NumberOfFrames\": \"x\"}",
                  R"(NumberOfFrames: expected an integer, got "x")"},
        LimitCase{"WrongKindIsDescribedBySize", nested("NumberOfFrames", 60, "1,2"),
                  "NumberOfFrames: expected an integer, got an array of 1 element"},
        LimitCase{"ObjectDescribedByKeyCount", R"({"WaveformName": {"a": 1, "b": [2, 3]}})",
                  "WaveformName: expected a string, got an object with 2 keys"},
        LimitCase{"LongStringCutShort", "{\"NumberOfFrames\": \"" + std::string(5000, 'x') + "\"}",
                  "NumberOfFrames: expected an integer, got \"" + std::string(57, 'x') +
                      "\"... (5000 bytes)"},
        LimitCase{"TooManyItemsInOneCollection", items("NRCarriers", 4097),
                  "NRCarriers: 4097 items are more than a collection may hold (4096)"},
        LimitCase{"ItemsPastTheSettingsBudget", items("NRCarriers", 4000),
                  "NRCarriers: 4000 items would take the document past 500000 settings in all"},
        LimitCase{"BudgetSpansNestedCollections",
                  [] {
                      std::string dlsch = "[";
                      for (int i = 0; i < 2000; ++i) dlsch += i ? ",{}" : "{}";
                      dlsch += "]";
                      std::string doc = "{\"NRCarriers\": [";
                      for (int c = 0; c < 8; ++c)
                          doc += std::string(c ? "," : "") + "{\"Downlink\": {\"DLSCH\": " + dlsch +
                                 "}}";
                      return doc + "]}";
                  }(),
                  "NRCarriers[2].Downlink.DLSCH: 2000 items would take the document past 500000 "
                  "settings in all"},
        LimitCase{"TooManyValues",
                  "{\"x\": [0" +
                      [] {
                          std::string commas;
                          for (int i = 0; i < 4'000'000; ++i) commas += ",0";
                          return commas;
                      }() +
                      "]}",
                  "document holds 4000003 values, more than 4000000"}),
    [](const ::testing::TestParamInfo<LimitCase>& info) { return info.param.name; });

TEST(JsonReading, NestingUpToTheLimitIsRead) {
    // An unknown key may hold any JSON value up to the nesting limit; the known keys still read.
    std::string message;
    onSmallStack([&] {
        message = errorOf("{\"Future\": " + std::string(63, '[') + std::string(63, ']') +
                          ", \"NumberOfFrames\": 2}");
    });
    EXPECT_EQ(message, "(no error)");
}

TEST(JsonReading, LargeCollectionWithinTheBoundsIsRead) {
    JsonSerializer reader;
    auto root = std::dynamic_pointer_cast<Models::Nr5g::NR5GWaveformSettings>(
        reader.deserialize(items("NRCarriers", 64)));
    ASSERT_NE(root, nullptr);
    EXPECT_EQ(root->NRCarriers->getValue()->getCount(), 64);
}

}  // namespace
