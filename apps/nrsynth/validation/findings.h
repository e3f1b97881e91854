#pragma once
// What the validator reports: one finding per setting that breaks a rule, with the path of the
// setting in the document, its value and the rule in words a person can act on.

#include <ostream>
#include <string>
#include <vector>

namespace nrsynth_cli::validation {

enum class Severity { Error, Warning };

struct Finding {
    Severity severity = Severity::Error;
    std::string path;   ///< JSON form: NRCarriers[0].Downlink.DLSCH[1].MCS
    std::string value;  ///< the value as the document holds it
    std::string rule;   ///< what was expected and where it comes from
};

/// The findings of one document, in the order the rules found them.
class FindingList {
  public:
    void error(std::string path, std::string value, std::string rule);
    void warning(std::string path, std::string value, std::string rule);

    const std::vector<Finding>& all() const { return findings_; }
    int errorCount() const;
    int warningCount() const;

  private:
    std::vector<Finding> findings_;
};

/// "error: PATH = VALUE: RULE", one line.
std::string formatFinding(const Finding& finding);

/// Every finding, one per line.
void printFindings(std::ostream& out, const FindingList& findings);

}  // namespace nrsynth_cli::validation
