// nrsynth: command-line front end of the waveform library.
#include <CLI/CLI.hpp>

#include <iostream>

#include "version.h"

int main(int argc, char** argv) {
    CLI::App app{"nrsynth: 5G NR baseband waveform synthesis (3GPP TS 38.211/212/213/214)"};
    app.set_version_flag("--version", Orvalis_NR::libraryVersion());
    app.require_subcommand(0, 1);
    CLI11_PARSE(app, argc, argv);
    if (app.get_subcommands().empty()) {
        std::cout << app.help();
    }
    return 0;
}
