#pragma once
// Reading a settings tree from JSON text, and writing one back.
//
// The document is one JSON object per model: keys are setting names, nested models are
// objects, collections are arrays of objects or {"$type": ..., "$values": [...]}. Any object
// may carry "$type", the full type name, which must then name the expected type. Omitted keys
// keep their constructor defaults; unknown keys are ignored (and listed).

#include <cstddef>
#include <memory>
#include <stdexcept>
#include <string>
#include <vector>

#include "model_base.h"

namespace Orvalis::Tessaline {

/// A document that cannot be read; what() names the path of the offending value.
class DeserializeError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

class JsonSerializer {
  public:
    /// Full type name of the root model of a waveform document.
    static constexpr const char* defaultRootType = "Models.Nr5g.NR5GWaveformSettings";

    /// Bounds of a readable document, generous for real waveforms; a document past one of
    /// them is refused before its tree is built.
    static constexpr std::size_t maxDocumentBytes = 64u << 20;
    static constexpr int maxNestingDepth = 64;
    static constexpr std::size_t maxJsonValues = 4'000'000;
    static constexpr std::size_t maxCollectionItems = 4096;
    static constexpr std::size_t maxTreeSettings = 500'000;

    JsonSerializer() = default;

    /// Builds a new tree whose root is a waveform document. Throws DeserializeError.
    std::shared_ptr<ModelBase> deserialize(const std::string& json);
    /// Builds a new tree whose root is the registered type `fullTypeName` (bare or full name).
    std::shared_ptr<ModelBase> deserialize(const std::string& json, const std::string& rootType);

    /// Collecting mode: a value of the wrong kind is recorded in getIssues() and skipped
    /// instead of ending the read. Malformed JSON still throws.
    void setCollectIssues(bool on) { collectIssues_ = on; }
    /// Paths of the keys that no setting has, from the last read.
    const std::vector<std::string>& getUnknownKeys() const { return unknownKeys_; }
    /// Messages of the values skipped in collecting mode, from the last read.
    const std::vector<std::string>& getIssues() const { return issues_; }

    /// The whole tree of `model` as JSON text in the input format: keys in declaration order,
    /// enumerations by enumerator name, doubles in a form that reads back exactly.
    static std::string serialize(const IModel& model, int indent = 2);

  private:
    bool collectIssues_ = false;
    std::vector<std::string> unknownKeys_;
    std::vector<std::string> issues_;

    friend class JsonReader;
};

}  // namespace Orvalis::Tessaline
