#pragma once
// The rules of a SigMF metadata file (v1.x core namespace) that a reader relies on, checked
// field by field: what must be there, of which type, in which order. Used by the tests to judge
// what `nrsynth generate --sigmf` writes without the Python sigmf package.

#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

namespace sigmf_rules {

/// True when `text` is a dataset format of the core namespace: (r|c) then f32, f64, i32, i16,
/// u32 or u16 with _le or _be, or i8 / u8 without one.
bool isDatasetFormat(const std::string& text);

/// True for a version "X.Y.Z" of decimal numbers.
bool isVersion(const std::string& text);

/// Every broken rule of `metadata`, one line each naming the field; empty when it is valid.
/// With `samples` from 0 up, annotations must also end within a dataset of that many samples.
std::vector<std::string> problems(const nlohmann::json& metadata, std::int64_t samples = -1);

}  // namespace sigmf_rules
