#include "plot.h"

#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <optional>
#include <vector>

extern char** environ;

namespace nrsynth_cli {

namespace {

namespace fs = std::filesystem;

constexpr const char* scriptName = "nrsynth_plot.py";
// Asks the interpreter whether it can import both packages without importing them (fast).
constexpr const char* moduleProbe =
    "import importlib.util as u, sys; "
    "sys.exit(0 if u.find_spec('numpy') and u.find_spec('matplotlib') else 3)";

/// Runs `arguments` (the first is the program's path) and waits; the exit code, or nothing when
/// the program could not be started or did not exit normally.
std::optional<int> runProgram(const std::vector<std::string>& arguments) {
    std::vector<char*> pointers;
    pointers.reserve(arguments.size() + 1);
    for (const auto& argument : arguments) pointers.push_back(const_cast<char*>(argument.c_str()));
    pointers.push_back(nullptr);
    pid_t child = 0;
    if (posix_spawn(&child, pointers[0], nullptr, nullptr, pointers.data(), environ) != 0) return std::nullopt;
    int status = 0;
    if (waitpid(child, &status, 0) != child || !WIFEXITED(status)) return std::nullopt;
    return WEXITSTATUS(status);
}

/// The running executable (through /proc, else argv[0]).
fs::path executablePath(const char* argv0) {
    std::error_code error;
    auto self = fs::read_symlink("/proc/self/exe", error);
    if (error) self = fs::absolute(argv0, error);
    return self;
}

bool isExecutable(const fs::path& path) {
    std::error_code error;
    return fs::is_regular_file(path, error) && access(path.c_str(), X_OK) == 0;
}

/// Interpreters to try: $NRSYNTH_PYTHON alone when set; otherwise python3 on PATH, then the
/// system one, which is where the Debian packages of scripts/deps.sh go.
std::vector<fs::path> pythonCandidates() {
    if (const char* chosen = std::getenv("NRSYNTH_PYTHON"); chosen != nullptr && *chosen != '\0')
        return {fs::path(chosen)};
    std::vector<fs::path> found;
    const char* path = std::getenv("PATH");
    std::string folders = path != nullptr ? path : "";
    std::size_t start = 0;
    while (start <= folders.size()) {
        const auto end = std::min(folders.find(':', start), folders.size());
        const auto folder = folders.substr(start, end - start);
        if (!folder.empty() && isExecutable(fs::path(folder) / "python3")) {
            found.push_back(fs::path(folder) / "python3");
            break;
        }
        start = end + 1;
    }
    if (found.empty() || found.front() != "/usr/bin/python3") found.emplace_back("/usr/bin/python3");
    return found;
}

}  // namespace

int plotWaveform(const PlotOptions& options, const char* argv0) {
    const auto self = executablePath(argv0);
    const auto script = self.parent_path() / scriptName;
    if (!fs::is_regular_file(script)) {
        std::cerr << "nrsynth plot: the plotting script " << script.string()
                  << " is missing: it belongs beside the nrsynth executable (build the nrsynth-cli target, or "
                     "cmake --install)\n";
        return 1;
    }
    std::vector<std::string> tried;
    std::optional<fs::path> python;
    for (const auto& candidate : pythonCandidates()) {
        if (!isExecutable(candidate)) continue;
        tried.push_back(candidate.string());
        if (runProgram({candidate.string(), "-c", moduleProbe}) == 0) {
            python = candidate;
            break;
        }
    }
    if (tried.empty()) {
        if (const char* chosen = std::getenv("NRSYNTH_PYTHON"); chosen != nullptr && *chosen != '\0') {
            std::cerr << "nrsynth plot: NRSYNTH_PYTHON=" << chosen << " is not an executable\n";
            return 1;
        }
        std::cerr << "nrsynth plot: python3 not found (looked on PATH and for /usr/bin/python3; NRSYNTH_PYTHON "
                     "names another): install python3, python3-numpy and python3-matplotlib (scripts/deps.sh)\n";
        return 1;
    }
    if (!python) {
        std::cerr << "nrsynth plot: numpy and matplotlib are not both importable by";
        for (const auto& name : tried) std::cerr << " " << name;
        std::cerr << ": install python3-numpy and python3-matplotlib (scripts/deps.sh)\n";
        return 1;
    }

    std::vector<std::string> arguments{python->string(), script.string(), options.wave, "--kind", options.kind,
                                       "-o", options.output, "--carrier", std::to_string(options.carrier),
                                       "--nrsynth", self.string()};
    if (!options.document.empty()) arguments.insert(arguments.end(), {"--doc", options.document});
    if (!options.labels.empty()) arguments.insert(arguments.end(), {"--labels", options.labels});
    const auto code = runProgram(arguments);
    if (!code) {
        std::cerr << "nrsynth plot: " << python->string() << " " << script.string() << " did not finish\n";
        return 1;
    }
    return *code;
}

}  // namespace nrsynth_cli
