// Read accessors of the numerology generator for the intermediate data export: each copies
// one channel item's stage as the item left it after its last slot. Nothing here runs unless
// the export is on.

#include <algorithm>
#include <string>

#include "carrier/nr5g_numerology_generator.h"
#include "common/failure.h"
#include "downlink/csi_rs_generator.h"
#include "downlink/pdcch_generator.h"
#include "downlink/pdsch_generator.h"
#include "downlink/prs_generator.h"

namespace Orvalis_NR {

namespace {

template <class Generator>
Generator& itemOf(const std::vector<Generator*>& generators, int item, const char* kind) {
    if (item < 0 || item >= static_cast<int>(generators.size()) || !generators[static_cast<std::size_t>(item)])
        failWith("The export asked for a channel item that does not exist.",
                 std::string(kind) + " item " + std::to_string(item) + " of " + std::to_string(generators.size()));
    return *generators[static_cast<std::size_t>(item)];
}

template <class Source, class Target>
void copyInto(const Source& source, std::vector<Target>& target) {
    target.assign(source.begin(), source.end());
}

/// Rows of a nested vector one after the other.
void joinRows(const std::vector<std::vector<std::complex<double>>>& rows, std::vector<std::complex<double>>& data) {
    data.clear();
    for (const auto& row : rows) data.insert(data.end(), row.begin(), row.end());
}

const std::vector<std::complex<double>>& rowOf(const std::vector<std::vector<std::complex<double>>>& rows,
                                               int antenna, const char* store) {
    if (antenna < 0 || antenna >= static_cast<int>(rows.size()))
        failWith("The export asked for an antenna the frame does not have.",
                 std::string(store) + " antenna " + std::to_string(antenna) + " of " + std::to_string(rows.size()));
    return rows[static_cast<std::size_t>(antenna)];
}

}  // namespace

void NR5GNumerologyGenerator::GetPDCCHBeforeCrc(int item, std::vector<char>& data) {
    copyInto(itemOf(pdcchGenerators, item, "PDCCH").PayloadBits, data);
}

void NR5GNumerologyGenerator::GetPDCCHAfterCrc(int item, std::vector<char>& data) {
    copyInto(itemOf(pdcchGenerators, item, "PDCCH").CrcAttachedBits, data);
}

void NR5GNumerologyGenerator::GetPDCCHAfterPolar(int item, std::vector<char>& data) {
    copyInto(itemOf(pdcchGenerators, item, "PDCCH").PolarBits, data);
}

void NR5GNumerologyGenerator::GetPDCCHAfterRateMatching(int item, std::vector<char>& data) {
    copyInto(itemOf(pdcchGenerators, item, "PDCCH").RateMatchedBits, data);
}

void NR5GNumerologyGenerator::GetPDCCHAfterMap(int item, std::vector<std::complex<double>>& data) {
    copyInto(itemOf(pdcchGenerators, item, "PDCCH").DataSymbols, data);
}

void NR5GNumerologyGenerator::GetPdcchDmrs(int item, std::vector<std::complex<double>>& data) {
    joinRows(itemOf(pdcchGenerators, item, "PDCCH").Dmrs, data);
}

void NR5GNumerologyGenerator::GetPDSCHBeforeCrc(int item, std::vector<char>& data) {
    data.clear();
    for (const auto& cw : itemOf(pdschGenerators, item, "PDSCH").CodeWords) cw.appendTransportBlock(data);
}

void NR5GNumerologyGenerator::GetPDSCHAfterCrc(int item, std::vector<char>& data) {
    data.clear();
    for (const auto& cw : itemOf(pdschGenerators, item, "PDSCH").CodeWords) cw.appendTransportBlockWithCrc(data);
}

void NR5GNumerologyGenerator::GetPDSCHAfterLdpc(int item, std::vector<int>& data) {
    data.clear();
    for (const auto& cw : itemOf(pdschGenerators, item, "PDSCH").CodeWords) cw.appendEncoderOutput(data);
}

void NR5GNumerologyGenerator::GetPDSCHAfterRateMatching(int item, std::vector<int>& data) {
    data.clear();
    const auto& pdsch = itemOf(pdschGenerators, item, "PDSCH");
    for (const auto& cw : pdsch.CodeWords) {
        if (!pdsch.CodingOn) {
            data.insert(data.end(), cw.CodedBits.begin(), cw.CodedBits.end());
            continue;
        }
        // Coded bits travel as symbols of Qm bits, the first in bit 0.
        const auto qm = static_cast<std::size_t>(cw.Qm);
        const auto g = std::min(static_cast<std::size_t>(std::max(cw.G, 0LL)), cw.CodedSymbols.size() * qm);
        for (std::size_t k = 0; k < g; ++k) data.push_back((cw.CodedSymbols[k / qm] >> (k % qm)) & 1);
    }
}

void NR5GNumerologyGenerator::GetPDSCHAfterMap(int item, std::vector<std::complex<double>>& data) {
    data.clear();
    for (const auto& cw : itemOf(pdschGenerators, item, "PDSCH").CodeWords) {
        // Layer mapping put symbol L i + j on layer j at i (TS 38.211 clause 7.3.1.3): undo it.
        const std::size_t symbols = cw.Layers.empty() ? 0 : cw.Layers[0].size();
        for (std::size_t i = 0; i < symbols; ++i)
            for (const auto& layer : cw.Layers)
                if (i < layer.size()) data.push_back(layer[i]);
    }
}

void NR5GNumerologyGenerator::GetPdschDmrs(int item, std::vector<std::complex<double>>& data) {
    data.clear();
    for (const auto& symbol : itemOf(pdschGenerators, item, "PDSCH").DmrsValues)
        for (const auto& port : symbol) data.insert(data.end(), port.begin(), port.end());
}

void NR5GNumerologyGenerator::GetCsiRsSeqence(int item, std::vector<char>& data) {
    copyInto(itemOf(csiRsGenerators, item, "CSI-RS").Pn, data);
}

void NR5GNumerologyGenerator::GetCsiRsMapped(int item, std::vector<std::complex<double>>& data) {
    joinRows(itemOf(csiRsGenerators, item, "CSI-RS").Values, data);
}

void NR5GNumerologyGenerator::GetPrsData(int item, std::vector<std::complex<double>>& data) {
    joinRows(itemOf(prsGenerators, item, "PRS").Sequence, data);
}

void NR5GNumerologyGenerator::GetMuxOut(std::vector<std::complex<double>>& data, int antenna) {
    copyInto(rowOf(grid, antenna, "Frame store"), data);
}

void NR5GNumerologyGenerator::GetCpAdded(std::vector<std::complex<double>>& data, int antenna) {
    copyInto(rowOf(cpAddedFrame, antenna, "Frame after the cyclic prefix"), data);
}

}  // namespace Orvalis_NR
