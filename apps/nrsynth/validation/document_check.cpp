#include "document_check.h"

#include <memory>

#include "derived_rules.h"
#include "framework/json_serializer.h"
#include "validator.h"

namespace nrsynth_cli::validation {

DocumentCheck checkDocument(const std::string& json) {
    DocumentCheck check;
    Orvalis::Tessaline::JsonSerializer reader;
    reader.setCollectIssues(true);
    const auto root = reader.deserialize(json);
    for (const auto& key : reader.getUnknownKeys()) check.readerProblems.push_back("unknown key: " + key);
    for (const auto& issue : reader.getIssues()) check.readerProblems.push_back("wrong value: " + issue);
    if (const auto waveform = std::dynamic_pointer_cast<Models::Nr5g::NR5GWaveformSettings>(root))
        check.findings = validateWaveform(*waveform);
    const auto document = nlohmann::ordered_json::parse(json, nullptr, false);
    if (document.is_object()) checkDerivedValues(document, check.findings);
    return check;
}

void printDocumentCheck(std::ostream& out, const std::string& name, const DocumentCheck& check) {
    for (const auto& line : check.readerProblems) out << line << "\n";
    printFindings(out, check.findings);
    const int errors = check.errorCount();
    const int warnings = check.warningCount();
    out << name << ": ";
    if (errors == 0) {
        out << "OK";
        if (warnings > 0) out << ", " << warnings << " warning(s)";
    } else {
        out << errors << " error(s), " << warnings << " warning(s)";
    }
    out << "\n";
}

}  // namespace nrsynth_cli::validation
