// Every example waveform of examples/ through the C interface, one run per iteration. Beside the
// time per frame it reports the carriers' set-up, the run's peak memory, and the frame's floor:
// its OFDM inverse transforms and its filters' convolutions (baseband and noise), timed in the
// same process with plain FFTW, measured plans and the best overlap-save block.
//
// Times are the thread's processor time. Counters: ms_frame (run time less set-up, per generated frame: NumberOfFrames + the extra
// pass of frame 0, per carrier), realtime (waveform duration over the whole run), setup_ms (as
// a run repeats it), first_setup_ms (the process's first, which also fills its tables),
// peak_MB (resident high-water mark of the run above the process before it), store_MB (frame
// stores of the numerologies with a channel), floor_ms and ratio (ms_frame over floor_ms).

#include <benchmark/benchmark.h>
#include <fftw3.h>
#include <malloc.h>
#include <unistd.h>

#include <algorithm>
#include <ctime>
#include <complex>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <nlohmann/json.hpp>
#include <sstream>
#include <string>
#include <vector>

#include "carrier/awgn_generator.h"
#include "carrier/nr5g_carrier_generator.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"
#include "nrsynth/nrsynth.h"

namespace {

using Models::Nr5g::NR5GWaveformSettings;

// The thread's processor time (user and system): on a shared machine far steadier than the wall
// clock, and the library runs on the calling thread alone.
struct Clock {
    static double now() {
        timespec time{};
        clock_gettime(CLOCK_THREAD_CPUTIME_ID, &time);
        return static_cast<double>(time.tv_sec) + 1e-9 * static_cast<double>(time.tv_nsec);
    }
};

double secondsSince(double start) { return Clock::now() - start; }

// One FFTW transform with a measured plan, out of place; planned once per length and direction.
class PlainTransform {
  public:
    PlainTransform(int length, int sign)
        : length_(length), in_(fftw_alloc_complex(static_cast<std::size_t>(length))),
          out_(fftw_alloc_complex(static_cast<std::size_t>(length))) {
        plan_ = fftw_plan_dft_1d(length, in_, out_, sign, FFTW_MEASURE);
        for (int i = 0; i < length; ++i) in_[i][0] = in_[i][1] = (i % 17) * 0.01;
    }
    ~PlainTransform() {
        fftw_destroy_plan(plan_);
        fftw_free(in_);
        fftw_free(out_);
    }
    PlainTransform(const PlainTransform&) = delete;
    PlainTransform& operator=(const PlainTransform&) = delete;

    // Seconds per transform, over at least 20 ms of repetitions.
    double seconds() {
        int count = 0;
        const auto start = Clock::now();
        do {
            for (int i = 0; i < 16; ++i) fftw_execute(plan_);
            count += 16;
        } while (secondsSince(start) < 0.02);
        return secondsSince(start) / count;
    }

    int length_;
    fftw_complex* in_;
    fftw_complex* out_;
    fftw_plan plan_;
};

// Seconds per transform of `length`; measured once per process.
double transformSeconds(int length, int sign) {
    static std::map<std::pair<int, int>, double> known;
    auto [it, fresh] = known.try_emplace({length, sign}, 0.0);
    if (fresh) it->second = PlainTransform(length, sign).seconds();
    return it->second;
}

// Overlap-save convolution of `samples` samples with `taps` taps at the best power-of-two
// transform length: per block a forward and an inverse transform (the spectrum product and copies
// are left out, so the floor is a lower bound).
double convolutionSeconds(int taps, int samples) {
    double best = 1e9;
    for (int length = 1024; length <= 65536; length <<= 1) {
        if (length < 2 * taps) continue;
        const int block = length - taps + 1;
        const int blocks = (samples + block - 1) / block;
        best = std::min(best, blocks * (transformSeconds(length, FFTW_FORWARD) + transformSeconds(length, FFTW_BACKWARD)));
    }
    return best;
}

std::shared_ptr<NR5GWaveformSettings> readTree(const std::string& text) {
    Orvalis::Tessaline::JsonSerializer reader;
    return std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(text));
}

struct Geometry {
    double setupSeconds = 0.0;    // Init of every enabled carrier and of the noise
    double floorSeconds = 0.0;    // per frame, all carriers and the noise
    double storeBytes = 0.0;      // frame stores of the numerologies with a channel
    int generatedFrames = 0;      // frames computed by one run, over all carriers and the noise
    double waveformSeconds = 0.0;
};

// Builds the carriers as the engine does, timing their set-up, and adds up their floors.
Geometry measureGeometry(const std::string& text) {
    Geometry geometry;
    auto settings = readTree(text);
    const double rate = settings->SampleRateAuto->getValue();
    const int frameLength = static_cast<int>(rate) / 100;
    const int frames = settings->NumberOfFrames->getValue();
    const int antennas = settings->NumberOfAntennas->getValue();
    geometry.waveformSeconds = 0.01 * frames;
    auto carriers = settings->NRCarriers->getValue();
    for (int c = 0; c < carriers->getCount(); ++c) {
        auto carrier = carriers->getItem(c);
        if (!carrier->Enabled->getValue()) continue;
        auto generator = std::make_unique<Orvalis_NR::NR5GCarrierGenerator>();
        const auto start = Clock::now();
        generator->Init(*carrier, *settings, frameLength * frames, 0);
        geometry.setupSeconds += secondsSince(start);
        geometry.generatedFrames += frames + 1;
        for (const auto& numerology : generator->numerologies) {
            if (!numerology.hasValidChannel) continue;
            geometry.storeBytes += static_cast<double>(antennas) * numerology.symbolsPerFrame * numerology.fftSize *
                                   (sizeof(std::complex<double>) + sizeof(int));
            geometry.floorSeconds +=
                antennas * numerology.symbolsPerFrame * transformSeconds(numerology.fftSize, FFTW_BACKWARD);
            if (!numerology.filters.empty())
                geometry.floorSeconds +=
                    antennas * convolutionSeconds(static_cast<int>(numerology.filters[0]->getCoefficients().size()),
                                                  frameLength);
        }
    }
    if (settings->AwgnEnabled->getValue()) {
        Orvalis_NR::AwgnGenerator noise;
        Models::Nr5g::NRCarrier unused;
        const auto start = Clock::now();
        noise.InitAwgn(unused, *settings, frameLength * frames, 0);
        geometry.setupSeconds += secondsSince(start);
        geometry.generatedFrames += frames + 1;
        geometry.floorSeconds += antennas * convolutionSeconds(1024, frameLength);
    }
    return geometry;
}

// Resident memory from /proc/self/status ("VmRSS" or "VmHWM"), bytes; 0 where unknown.
double statusBytes(const std::string& field) {
    std::ifstream status("/proc/self/status");
    std::string line;
    while (std::getline(status, line))
        if (line.rfind(field + ":", 0) == 0) return std::stod(line.substr(field.size() + 1)) * 1024.0;
    return 0.0;
}

// Returns freed heap to the system and restarts the resident high-water mark (Linux 4.0 and
// later), so that the next peak is the run's own; false where not allowed.
bool resetPeak() {
    malloc_trim(0);
    std::ofstream clear("/proc/self/clear_refs");
    clear << "5";
    return static_cast<bool>(clear.flush());
}

void BM_ExampleWaveform(benchmark::State& state, const std::string& file) {
    std::ifstream in(std::string(NRSYNTH_EXAMPLES_DIR) + "/" + file);
    const std::string text = nlohmann::json::parse(in).dump();
    const auto path = (std::filesystem::temp_directory_path() /
                       ("nrsynth_bench_" + std::to_string(::getpid()) + "_" + file + ".bin"))
                          .string();
    StartDeserialize(text.c_str());
    if (GetStatus() != 0) {
        state.SkipWithError(GetLog());
        return;
    }
    Geometry geometry;
    double firstSetupSeconds = 0.0;
    try {
        // Twice: the first set-up in a process also fills the process-wide tables and caches,
        // which the run then finds ready; the second is the set-up the run repeats.
        firstSetupSeconds = measureGeometry(text).setupSeconds;
        resetPeak();
        geometry = measureGeometry(text);
    } catch (const char* failure) {
        state.SkipWithError(failure);
        return;
    }

    double runSeconds = 0.0;
    double peak = 0.0;
    for (auto _ : state) {
        const bool peakKnown = resetPeak();
        const double before = statusBytes("VmRSS");
        const auto start = Clock::now();
        InitEngine(path.c_str());
        RunEngine();
        runSeconds += secondsSince(start);
        if (GetStatus() != 0) {
            state.SkipWithError(GetLog());
            break;
        }
        if (peakKnown) peak = std::max(peak, statusBytes("VmHWM") - before);
    }
    std::error_code ignored;
    std::filesystem::remove(path, ignored);
    std::filesystem::remove(path + ".mkr", ignored);

    const double perRun = runSeconds / static_cast<double>(std::max<std::int64_t>(state.iterations(), 1));
    const double perFrame = (perRun - geometry.setupSeconds) / std::max(geometry.generatedFrames, 1);
    state.counters["ms_frame"] = perFrame * 1e3;
    state.counters["realtime"] = geometry.waveformSeconds / perRun;
    state.counters["setup_ms"] = geometry.setupSeconds * 1e3;
    state.counters["first_setup_ms"] = firstSetupSeconds * 1e3;
    state.counters["peak_MB"] = peak / 1e6;
    state.counters["store_MB"] = geometry.storeBytes / 1e6;
    state.counters["floor_ms"] = geometry.floorSeconds * 1e3;
    state.counters["ratio"] = geometry.floorSeconds > 0.0 ? perFrame / geometry.floorSeconds : 0.0;
}

// Registered at load, one benchmark per example; all_models.json shows every setting at once and
// is not a waveform meant to run.
const bool registered = [] {
    std::vector<std::string> files;
    for (const auto& entry : std::filesystem::directory_iterator(NRSYNTH_EXAMPLES_DIR))
        if (entry.path().extension() == ".json" && entry.path().filename() != "all_models.json")
            files.push_back(entry.path().filename().string());
    std::sort(files.begin(), files.end());
    for (const auto& file : files)
        benchmark::RegisterBenchmark(("BM_ExampleWaveform/" + file).c_str(), BM_ExampleWaveform, file)
            ->Unit(benchmark::kMillisecond)
            ->Iterations(1);
    return true;
}();

}  // namespace
