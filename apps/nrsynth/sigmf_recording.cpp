#include "sigmf_recording.h"

#include <algorithm>
#include <cstdio>
#include <filesystem>

#include "host/derived_values.h"
#include "models/nr5g_waveform_settings.h"
#include "version.h"

namespace nrsynth_cli {

namespace {

using Models::Nr5g::CarrierType;

const char* carrierTypeName(CarrierType type) {
    switch (type) {
        case CarrierType::DL:
            return "DL";
        case CarrierType::UL:
            return "UL";
        case CarrierType::PRACH:
            return "PRACH";
        case CarrierType::CW:
            return "CW";
    }
    return "?";
}

std::string numberText(const char* format, double value) {
    char text[64];
    std::snprintf(text, sizeof text, format, value);
    return text;
}

template <typename Carrier>
void addBands(const Orvalis::Tessaline::ModelCollection<Carrier>& carriers,
              std::vector<CarrierBand>& bands) {
    for (int i = 0; i < carriers.getCount(); ++i) {
        const auto carrier = carriers.getItem(i);
        if (!carrier || !carrier->Enabled->getValue()) continue;
        const auto type = carrier->CarrierType->getValue();
        const double centre = carrier->FrequencyOffset->getValue();
        CarrierBand band;
        band.label = "carrier " + std::to_string(i) + " " + carrierTypeName(type);
        if (type == CarrierType::CW) {
            band.lowerHz = band.upperHz = centre;
            band.comment = "continuous wave at " + numberText("%+.0f", centre) + " Hz";
        } else {
            const int mu =
                nrsynth_host::muOfNumerology(static_cast<int>(carrier->Numerology->getValue()));
            const double spacing = 15000.0 * (1 << mu);
            const int rbs = std::max(carrier->NumberOfRB->getValue(), 0);
            const double width = rbs * 12 * spacing;
            band.lowerHz = centre - width / 2;
            band.upperHz = centre + width / 2;
            band.comment = std::to_string(rbs) + " RB at " + numberText("%.0f", spacing / 1000) +
                           " kHz about " + numberText("%+.0f", centre) + " Hz";
        }
        bands.push_back(std::move(band));
    }
}

}  // namespace

std::vector<CarrierBand> carrierBands(const Models::Nr5g::NR5GWaveformSettings& settings) {
    std::vector<CarrierBand> bands;
    if (settings.Capability->getValue() == Models::Nr5g::CapabilityEnum::Realtime) {
        if (const auto carriers = settings.NRCarriersRT->getValue()) addBands(*carriers, bands);
    } else if (const auto carriers = settings.NRCarriers->getValue()) {
        addBands(*carriers, bands);
    }
    return bands;
}

std::string recordingDescription(const Models::Nr5g::NR5GWaveformSettings& settings,
                                 const std::string& documentPath, int antenna, int antennas) {
    std::string text = settings.WaveformName->getValue();
    if (text.empty())
        text = "5G NR waveform " + std::filesystem::path(documentPath).filename().string();
    if (antennas > 1)
        text += ", antenna " + std::to_string(antenna) + " of " + std::to_string(antennas);
    return text;
}

nlohmann::ordered_json sigmfMetadata(const RecordingFacts& facts) {
    using nlohmann::ordered_json;
    ordered_json global{{"core:datatype", facts.datatype}};
    if (facts.sampleRate >= 1.0) global["core:sample_rate"] = facts.sampleRate;
    global["core:version"] = kSigmfVersion;
    global["core:num_channels"] = 1;
    global["core:description"] = facts.description;
    global["core:author"] = "nrsynth";
    global["core:hw"] = "none: synthesised by software, not captured from a radio";
    global["core:recorder"] = std::string("nrsynth ") + Orvalis_NR::libraryVersion();

    ordered_json captures = ordered_json::array();
    captures.push_back(
        ordered_json{{"core:sample_start", 0}, {"core:frequency", facts.radioFrequency}});

    // An annotation needs a sample count above 0: an empty recording has none.
    ordered_json annotations = ordered_json::array();
    if (facts.samples > 0) {
        for (const auto& band : facts.carriers)
            annotations.push_back(
                ordered_json{{"core:sample_start", 0},
                             {"core:sample_count", facts.samples},
                             {"core:freq_lower_edge", facts.radioFrequency + band.lowerHz},
                             {"core:freq_upper_edge", facts.radioFrequency + band.upperHz},
                             {"core:label", band.label},
                             {"core:comment", band.comment}});
        const std::uint64_t frame = facts.frameLength > 0 ? facts.frameLength : facts.samples;
        for (std::uint64_t start = 0, index = 0; start < facts.samples; start += frame, ++index)
            annotations.push_back(
                ordered_json{{"core:sample_start", start},
                             {"core:sample_count", std::min(frame, facts.samples - start)},
                             {"core:label", "frame " + std::to_string(index)}});
    }
    return ordered_json{{"global", std::move(global)},
                        {"captures", std::move(captures)},
                        {"annotations", std::move(annotations)}};
}

}  // namespace nrsynth_cli
