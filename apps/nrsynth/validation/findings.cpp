#include "findings.h"

#include <algorithm>

namespace nrsynth_cli::validation {

void FindingList::error(std::string path, std::string value, std::string rule) {
    findings_.push_back({Severity::Error, std::move(path), std::move(value), std::move(rule)});
}

void FindingList::warning(std::string path, std::string value, std::string rule) {
    findings_.push_back({Severity::Warning, std::move(path), std::move(value), std::move(rule)});
}

int FindingList::errorCount() const {
    return static_cast<int>(std::count_if(findings_.begin(), findings_.end(),
                                          [](const Finding& f) { return f.severity == Severity::Error; }));
}

int FindingList::warningCount() const { return static_cast<int>(findings_.size()) - errorCount(); }

std::string formatFinding(const Finding& finding) {
    return std::string(finding.severity == Severity::Error ? "error" : "warning") + ": " + finding.path + " = " +
           finding.value + ": " + finding.rule;
}

void printFindings(std::ostream& out, const FindingList& findings) {
    for (const auto& finding : findings.all()) out << formatFinding(finding) << "\n";
}

}  // namespace nrsynth_cli::validation
