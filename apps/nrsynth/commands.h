#pragma once
// Subcommands of the command-line tool. Each returns the process exit code.

#include <string>

namespace nrsynth_cli {

/// Prints the effective settings tree of a waveform document, defaults filled in.
int showDocument(const std::string& path);
/// Prints the document with every host value it leaves out worked out (the document
/// `generate` hands the library), and on stderr what was added and what could not be.
int showDerivedDocument(const std::string& path);
/// Prints a default instance of a registered model type ("NRDLSCH" or its full name).
int showDefaults(const std::string& typeName);
/// Reports unknown keys, values of the wrong kind and the 3GPP-aware findings; exit code 1 when
/// there is any error (warnings alone exit 0).
int validateDocument(const std::string& path);

/// The whole content of a file; throws std::runtime_error naming the file when unreadable.
std::string readTextFile(const std::string& path);

/// The document of `path` completed with its derived values, as text, with the problems printed
/// on stderr under `command`; throws std::runtime_error when the file cannot be read.
struct CompletedText {
    std::string text;
    int derived = 0;
    int problems = 0;
};
CompletedText completedDocumentText(const std::string& path, const std::string& command);

}  // namespace nrsynth_cli
