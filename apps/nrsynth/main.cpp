// nrsynth: command-line front end of the waveform library.
#include <CLI/CLI.hpp>

#include <iostream>
#include <iterator>
#include <string>
#include <vector>

#include "commands.h"
#include "generate.h"
#include "plot.h"
#include "version.h"

int main(int argc, char** argv) {
    CLI::App app{"nrsynth: 5G NR baseband waveform synthesis (3GPP TS 38.211/212/213/214)"};
    app.set_version_flag("--version", Orvalis_NR::libraryVersion());
    app.require_subcommand(1);

    std::string wave;
    std::string defaultsType;
    auto* show = app.add_subcommand(
        "show", "Print the effective settings tree of WAVE.json (every setting, defaults filled in)");
    show->add_option("wave", wave, "waveform document (JSON)");
    show->add_option("--defaults", defaultsType,
                     "print a default instance of a model type instead, e.g. NRDLSCH");
    bool derived = false;
    show->add_flag("--derived", derived,
                   "print the document itself with every host value it leaves out worked out "
                   "(Mu, SampleRateAuto, SlotIndexArrayStr, LastSymbol, BWPIndex, Modulation, CodingRate, "
                   "TransportBlockSize): what generate hands the library");

    auto* validate = app.add_subcommand(
        "validate", "Check WAVE.json: unknown keys, values of the wrong kind and the 3GPP rules (ranges, "
                    "allocations, DM-RS, collisions); exit code 1 on any error");
    validate->add_option("wave", wave, "waveform document (JSON)")->required();

    nrsynth_cli::GenerateOptions generateOptions;
    auto* generate = app.add_subcommand(
        "generate", "Generate WAVE.json through the C interface: one sample file (complex double, or "
                    "as --format says) and one marker file (.mkr) per antenna");
    generate->add_option("wave", generateOptions.wave, "waveform document (JSON)")->required();
    generate->add_option("-o,--output", generateOptions.output,
                         "sample file path; several antennas get their number before the extension")
        ->capture_default_str();
    generate->add_flag("--force", generateOptions.force, "generate even when the checks of `validate` find errors");
    generate->add_flag("--as-is", generateOptions.asIs,
                       "hand the document to the library as it stands, without working out the host values it "
                       "leaves out");
    generate->add_option("--export", generateOptions.exportFolder, "write every channel's stages of frame 0 as text files to DIR/Intermediate Data");
    generate->add_option("--format", generateOptions.format,
                         "sample format: cf64 (the library's complex doubles), cf32 (complex float) or ci16 (complex "
                         "int16, full scale 32767), interleaved I/Q, little endian; cf32 and ci16 replace the cf64 "
                         "file of each antenna under the same name, marker files stay as they are")
        ->type_name("cf64|cf32|ci16")
        ->capture_default_str();
    generate->add_option("--backoff-db", generateOptions.backoffDb,
                         "ci16: put the RMS of the strongest antenna B dB below full scale (samples beyond full scale "
                         "clip and are counted); default: the largest |I| or |Q| of all antennas at full scale")
        ->type_name("B");
    generate->add_flag("--sigmf", generateOptions.sigmf,
                       "write a SigMF recording per antenna: NAME.sigmf-data (the samples in --format, replacing "
                       "the sample file) and NAME.sigmf-meta; marker files stay as they are");

    nrsynth_cli::PlotOptions plotOptions;
    auto* plot = app.add_subcommand(
        "plot", "Draw WAVE.bin as a PNG picture (Python 3 with numpy and matplotlib): spectrum, CCDF, power "
                "over time with the markers, the resource grid coloured by channel, or the constellations");
    plot->add_option("wave", plotOptions.wave, "sample file written by generate")->required();
    plot->add_option("--doc", plotOptions.document,
                     "the waveform document of the file (sample rate, carriers; grid and constellation "
                     "generate frame 0 of it again)");
    plot->add_option("--kind", plotOptions.kind, "picture kind")
        ->required()
        ->check(CLI::IsMember(std::vector<std::string>(std::begin(nrsynth_cli::plotKinds),
                                                       std::end(nrsynth_cli::plotKinds))));
    plot->add_option("-o,--output", plotOptions.output, "PNG picture to write (1200 x 800 pixels)")->required();
    plot->add_option("--carrier", plotOptions.carrier, "carrier of the grid and constellation pictures")
        ->capture_default_str();
    plot->add_option("--labels", plotOptions.labels, "grid: also write the channel of every element to FILE.npz");

    CLI11_PARSE(app, argc, argv);

    if (*show) {
        if (!defaultsType.empty()) return nrsynth_cli::showDefaults(defaultsType);
        if (wave.empty()) {
            std::cerr << "nrsynth show: give WAVE.json or --defaults TYPE\n";
            return 1;
        }
        return derived ? nrsynth_cli::showDerivedDocument(wave) : nrsynth_cli::showDocument(wave);
    }
    if (*validate) return nrsynth_cli::validateDocument(wave);
    if (*generate) return nrsynth_cli::generateWaveform(generateOptions);
    if (*plot) return nrsynth_cli::plotWaveform(plotOptions, argv[0]);
    return 0;
}
