#pragma once
// Subcommands of the command-line tool. Each returns the process exit code.

#include <string>

namespace nrsynth_cli {

/// Prints the effective settings tree of a waveform document, defaults filled in.
int showDocument(const std::string& path);
/// Prints a default instance of a registered model type ("NRDLSCH" or its full name).
int showDefaults(const std::string& typeName);
/// Reports unknown keys, values of the wrong kind and the 3GPP-aware findings; exit code 1 when
/// there is any error (warnings alone exit 0).
int validateDocument(const std::string& path);

/// The whole content of a file; throws std::runtime_error naming the file when unreadable.
std::string readTextFile(const std::string& path);

}  // namespace nrsynth_cli
