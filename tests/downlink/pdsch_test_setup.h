#pragma once
// A PDSCH generator set up from a small JSON document, for the tests that look at one feature
// of it: a 30 kHz carrier, one bandwidth part, one DLSCH item; each test patches what it needs.

#include <gtest/gtest.h>

#include <memory>
#include <nlohmann/json.hpp>
#include <string>
#include <vector>

#include "downlink/pdsch_generator.h"
#include "framework/json_serializer.h"
#include "models/nr5g_waveform_settings.h"

namespace pdsch_setup {

using Models::Nr5g::NR5GWaveformSettings;

struct Patch {
    nlohmann::json dlsch = nlohmann::json::object();
    nlohmann::json bwp = nlohmann::json::object();
    nlohmann::json downlink = nlohmann::json::object();  ///< keys of the carrier's Downlink
    nlohmann::json carrier = nlohmann::json::object();
};

constexpr int kCellId = 101, kRnti = 0x4321, kNId = 77;

/// One carrier at 30 kHz: BWP of 52 RBs at CRB 3, one DLSCH over all of it in slot 0, QPSK,
/// 14 symbols of mapping type A, single-symbol DM-RS type 1 at symbol 2, no PT-RS.
inline nlohmann::json document(const Patch& patch) {
    nlohmann::json dlsch = {
        {"Name", "PDSCH"}, {"DMRSports", "0"}, {"AntennaPortArray", "1000"}, {"NumberOfLayers", 1},
        {"NumberOfCodewords", 1}, {"NumberOfDMRSCDMGroup", 1}, {"RNTI", kRnti}, {"n_ID", kNId},
        {"SlotIndexArrayStr", "0"}, {"FirstSymbol", 0}, {"LastSymbol", 13}, {"SymbolNumber", 14},
        {"BWPIndex", 0}, {"RBOffset", 0}, {"RBNumber", 52}, {"RAType", "RAType1"}, {"Modulation", "QPSK"},
        {"TransportBlockSize", 1000}, {"CodingRate", 0.3}, {"DMRSConfigurationType", "Type1"},
        {"DMRSDuration", "SingleSymbol"}, {"DMRSaddpos", 0}, {"PDSCHMappingType", "A"}, {"DMRStypeApos", 2},
        {"PTRSEnabled", false}, {"PRBBundleSize", "Wideband"},
        {"PayloadData", {{"PayLoadDataType", "Pattern"}, {"PatternBits", "1011001110001011110100100001101"}}}};
    dlsch.update(patch.dlsch);
    nlohmann::json bwp = {{"Name", "BWP1"}, {"Numerology", "SCS30k"}, {"Mu", 1}, {"RBOffset", 3}, {"RBNumber", 52}};
    bwp.update(patch.bwp);
    nlohmann::json downlink = {{"BWP", {bwp}}, {"DLSCH", {dlsch}}};
    downlink.update(patch.downlink);
    nlohmann::json carrier = {{"CarrierType", "DL"}, {"CellID", kCellId}, {"FrequencyOffsetOfPointA", -9.0e6},
                              {"Downlink", downlink}};
    carrier.update(patch.carrier);
    return {{"SampleRateAuto", 30.72e6}, {"NumberOfAntennas", 1}, {"NRCarriers", {carrier}}};
}

/// The settings tree of `doc` and a generator initialised from its first DLSCH item.
struct PdschUnderTest {
    std::shared_ptr<NR5GWaveformSettings> root;
    std::shared_ptr<Models::Nr5g::NRCarrier> carrier;
    std::shared_ptr<Models::Nr5g::NRDLSCH> dlsch;
    std::shared_ptr<Models::Nr5g::NRDLBWP> bwp;
    Orvalis_NR::PDSCH_Generator generator;
    std::vector<Orvalis_NR::PBCH_Generator*> pbch;
    std::vector<Orvalis_NR::PDCCH_Generator*> pdcch;
    std::vector<Orvalis_NR::PRS_Generator*> prs;
    int fft;

    explicit PdschUnderTest(const nlohmann::json& doc, int fftSize = 1024) : fft(fftSize) {
        Orvalis::Tessaline::JsonSerializer reader;
        root = std::dynamic_pointer_cast<NR5GWaveformSettings>(reader.deserialize(doc.dump()));
        carrier = root->NRCarriers->getValue()->getItem(0);
        dlsch = carrier->Downlink->getValue()->DLSCH->getValue()->getItem(0);
        bwp = carrier->Downlink->getValue()->BWP->getValue()->getItem(0);
    }
    void init() { generator.Init(carrier.get(), dlsch.get(), bwp.get(), fft, pbch, pdcch, prs); }
};

/// A frame store of `rows` antennas, 280 symbols (one frame at 30 kHz) of `fft` subcarriers.
struct Store {
    Orvalis_NR::SlotGrid grid;
    Orvalis_NR::OccupancyGrid occupancy;
    Orvalis_NR::OccupancyGrid flags;
    int fft;
    Store(int rows, int fftSize)
        : grid(static_cast<std::size_t>(rows), std::vector<std::complex<double>>(280 * static_cast<std::size_t>(fftSize))),
          occupancy(static_cast<std::size_t>(rows), std::vector<int>(280 * static_cast<std::size_t>(fftSize), 0)),
          flags(static_cast<std::size_t>(rows), std::vector<int>(280, 0)),
          fft(fftSize) {}
    /// Index of subcarrier `crbSubcarrier` (from point A) of frame symbol `symbol`, point A
    /// `pointA` subcarriers from the centre.
    std::size_t at(int symbol, int crbSubcarrier, int pointA) const {
        int column = pointA + crbSubcarrier;
        if (column < 0) column += fft;
        return static_cast<std::size_t>(symbol) * static_cast<std::size_t>(fft) + static_cast<std::size_t>(column);
    }
};

}  // namespace pdsch_setup
