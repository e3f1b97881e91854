#include "sigmf_rules.h"

#include <cctype>
#include <cstdint>
#include <initializer_list>

namespace sigmf_rules {

namespace {

using nlohmann::json;

bool isCount(const json& value) {
    return value.is_number_unsigned() ||
           (value.is_number_integer() && value.get<std::int64_t>() >= 0);
}

bool isNumberWithin(const json& value, double lowest, double highest) {
    return value.is_number() && value.get<double>() >= lowest && value.get<double>() <= highest;
}

class Checker {
  public:
    std::vector<std::string> found;

    void fail(const std::string& where, const std::string& what) {
        found.push_back(where + ": " + what);
    }

    /// Fields of one object: those named must have the kind given, when present.
    void strings(const json& object, const std::string& where,
                 std::initializer_list<const char*> keys) {
        for (const char* key : keys)
            if (object.contains(key) && !object[key].is_string())
                fail(where + "." + key, "must be a string");
    }
    void counts(const json& object, const std::string& where,
                std::initializer_list<const char*> keys) {
        for (const char* key : keys)
            if (object.contains(key) && !isCount(object[key]))
                fail(where + "." + key, "must be an integer from 0 up");
    }

    void global(const json& global) {
        if (!global.is_object()) return fail("global", "must be an object");
        if (!global.contains("core:datatype"))
            fail("global", "core:datatype is required");
        else if (!global["core:datatype"].is_string() ||
                 !isDatasetFormat(global["core:datatype"].get<std::string>()))
            fail("global.core:datatype", "must be a dataset format such as cf32_le");
        if (!global.contains("core:version"))
            fail("global", "core:version is required");
        else if (!global["core:version"].is_string() ||
                 !isVersion(global["core:version"].get<std::string>()))
            fail("global.core:version", "must be a version X.Y.Z");
        if (global.contains("core:sample_rate") &&
            !isNumberWithin(global["core:sample_rate"], 1, 1e12))
            fail("global.core:sample_rate", "must be a number from 1 to 1e12");
        if (global.contains("core:num_channels") &&
            !(global["core:num_channels"].is_number_integer() &&
              global["core:num_channels"].get<std::int64_t>() >= 1))
            fail("global.core:num_channels", "must be an integer from 1 up");
        if (global.contains("core:metadata_only") && !global["core:metadata_only"].is_boolean())
            fail("global.core:metadata_only", "must be a boolean");
        strings(
            global, "global",
            {"core:author", "core:description", "core:hw", "core:recorder", "core:license",
             "core:collection", "core:dataset", "core:data_doi", "core:meta_doi", "core:sha512"});
        counts(global, "global", {"core:offset", "core:trailing_bytes"});
    }

    /// Segments of captures or annotations: objects with a core:sample_start, in ascending order.
    template <typename EachSegment>
    void segments(const json& list, const std::string& name, EachSegment each) {
        if (!list.is_array()) return fail(name, "must be an array");
        std::uint64_t previous = 0;
        for (std::size_t i = 0; i < list.size(); ++i) {
            const std::string where = name + "[" + std::to_string(i) + "]";
            const json& segment = list[i];
            if (!segment.is_object()) {
                fail(where, "must be an object");
                continue;
            }
            if (!segment.contains("core:sample_start")) {
                fail(where, "core:sample_start is required");
                continue;
            }
            if (!isCount(segment["core:sample_start"])) {
                fail(where + ".core:sample_start", "must be an integer from 0 up");
                continue;
            }
            const auto start = segment["core:sample_start"].get<std::uint64_t>();
            if (start < previous) fail(where, "not sorted by core:sample_start");
            previous = start;
            each(segment, where, start);
        }
    }
};

}  // namespace

bool isDatasetFormat(const std::string& text) {
    if (text.size() < 3 || (text[0] != 'r' && text[0] != 'c')) return false;
    const std::string type = text.substr(1);
    if (type == "i8" || type == "u8") return true;
    for (const char* wide : {"f32", "f64", "i32", "i16", "u32", "u16"})
        if (type == std::string(wide) + "_le" || type == std::string(wide) + "_be") return true;
    return false;
}

bool isVersion(const std::string& text) {
    int parts = 0;
    std::size_t digits = 0;
    for (const char c : text) {
        if (std::isdigit(static_cast<unsigned char>(c))) {
            ++digits;
        } else if (c == '.' && digits > 0) {
            ++parts;
            digits = 0;
        } else {
            return false;
        }
    }
    return parts == 2 && digits > 0;
}

std::vector<std::string> problems(const json& metadata, std::int64_t samples) {
    Checker check;
    if (!metadata.is_object()) return {"the metadata must be a JSON object"};
    for (const char* key : {"global", "captures", "annotations"})
        if (!metadata.contains(key)) check.fail(key, "is required");
    for (const auto& item : metadata.items())
        if (item.key() != "global" && item.key() != "captures" && item.key() != "annotations")
            check.fail(item.key(), "is not a top-level object of SigMF metadata");
    if (metadata.contains("global")) check.global(metadata["global"]);

    if (metadata.contains("captures"))
        check.segments(metadata["captures"], "captures",
                       [&](const json& capture, const std::string& where, std::uint64_t) {
                           if (capture.contains("core:frequency") &&
                               !isNumberWithin(capture["core:frequency"], -1e12, 1e12))
                               check.fail(where + ".core:frequency",
                                          "must be a number within +-1e12 Hz");
                           check.counts(capture, where, {"core:global_index", "core:header_bytes"});
                           check.strings(capture, where, {"core:datetime"});
                       });

    if (metadata.contains("annotations"))
        check.segments(
            metadata["annotations"], "annotations",
            [&](const json& note, const std::string& where, std::uint64_t start) {
                if (note.contains("core:sample_count")) {
                    const json& count = note["core:sample_count"];
                    if (!isCount(count) || count.get<std::uint64_t>() == 0)
                        check.fail(where + ".core:sample_count", "must be an integer above 0");
                    else if (samples >= 0 && start + count.get<std::uint64_t>() >
                                                 static_cast<std::uint64_t>(samples))
                        check.fail(where, "runs past the end of the dataset");
                }
                const bool lower = note.contains("core:freq_lower_edge");
                const bool upper = note.contains("core:freq_upper_edge");
                if (lower != upper)
                    check.fail(where, "core:freq_lower_edge and core:freq_upper_edge go together");
                if (lower && upper) {
                    const json& low = note["core:freq_lower_edge"];
                    const json& high = note["core:freq_upper_edge"];
                    if (!isNumberWithin(low, -1e12, 1e12) || !isNumberWithin(high, -1e12, 1e12))
                        check.fail(where, "frequency edges must be numbers within +-1e12 Hz");
                    else if (low.get<double>() > high.get<double>())
                        check.fail(where, "core:freq_lower_edge is above core:freq_upper_edge");
                }
                check.strings(note, where,
                              {"core:label", "core:comment", "core:generator", "core:uuid"});
                if (note.contains("core:label") && note["core:label"].is_string() &&
                    note["core:label"].get<std::string>().size() > 20)
                    check.fail(where + ".core:label", "longer than the 20 characters a GUI shows");
            });
    return check.found;
}

}  // namespace sigmf_rules
