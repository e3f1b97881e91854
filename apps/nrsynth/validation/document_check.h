#pragma once
// One pass over a waveform document as the CLI sees it: the reader's key and kind problems,
// then the 3GPP-aware findings of the settings tree.

#include <ostream>
#include <string>
#include <vector>

#include "findings.h"

namespace nrsynth_cli::validation {

struct DocumentCheck {
    std::vector<std::string> readerProblems;  ///< "unknown key: ..." and "wrong value: ..." lines
    FindingList findings;

    /// Reader problems count as errors: the library would not see what the document says.
    int errorCount() const { return static_cast<int>(readerProblems.size()) + findings.errorCount(); }
    int warningCount() const { return findings.warningCount(); }
};

/// Checks a JSON text as the library would receive it (host values already worked out, or
/// as-is); throws std::exception when it is no JSON document at all.
DocumentCheck checkDocument(const std::string& json);

/// The problems and findings, one per line, then "NAME: OK" or "NAME: E error(s), W warning(s)".
void printDocumentCheck(std::ostream& out, const std::string& name, const DocumentCheck& check);

}  // namespace nrsynth_cli::validation
