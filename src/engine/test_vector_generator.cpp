#include "engine/test_vector_generator.h"

#include <algorithm>
#include <cstdio>
#include <fstream>

#include "carrier/nr5g_carrier_generator.h"
#include "carrier/nr5g_numerology_generator.h"
#include "common/failure.h"
#include "common/log.h"
#include "downlink/pbch_generator.h"
#include "engine/nr5g_engine.h"
#include "framework/tools.h"

namespace Orvalis_NR {

namespace {

constexpr std::size_t kSamplesPerWrite = 100000;

/// The folder without its trailing separators, of either kind.
std::string withoutTrailingSeparators(std::string folder) {
    for (;;) {
        auto trimmed = Orvalis::Tessaline::Tools::trimEnd(Orvalis::Tessaline::Tools::trimEnd(folder, "/"), "\\");
        if (trimmed == folder) return folder;
        folder = std::move(trimmed);
    }
}

template <class Value>
void saveIntegers(const std::vector<Value>& data, const std::string& fileName) {
    // A file that cannot be opened leaves the stream failed, and every write does nothing.
    std::ofstream out(fileName, std::ios::out | std::ios::trunc);
    if (!out) return;
    std::string text;
    text.reserve(data.size() * 3);
    char number[16];
    for (const Value value : data) {
        const int length = std::snprintf(number, sizeof number, "%d\n", static_cast<int>(value));
        text.append(number, static_cast<std::size_t>(length));
    }
    out.write(text.data(), static_cast<std::streamsize>(text.size()));
}

/// The first SS/PBCH block of the frame that was sent: the one whose coding stages were kept.
int firstSentBlock(const PBCH_Generator& pbch) {
    for (int i = 0; i < pbch.ActiveCount; ++i) {
        const auto& levels = pbch.DataAmplitude;
        if (levels.empty() || levels[static_cast<std::size_t>(i) % levels.size()] != 0.0) return i;
    }
    return -1;
}

}  // namespace

void TestVectorGenerator::Init(NR5GEngine* owner, std::string folder) {
    if (!owner) fail("The data export needs an engine.");
    engine = owner;
    numberOfAntennas = owner->numberOfAntennas;
    baseFolder = withoutTrailingSeparators(std::move(folder)) + "/";
    outputFolder = Orvalis::Tessaline::Path::combine(baseFolder, "Intermediate Data") + "/";
}

void TestVectorGenerator::GenerateOneFrame(int carrierIndex, int) {
    if (!engine) fail("The data export has no engine: call Init first.");
    auto& generators = engine->carrierGenerators;
    if (carrierIndex < 0 || carrierIndex >= static_cast<int>(generators.size()) ||
        !generators[static_cast<std::size_t>(carrierIndex)])
        failWith("The data export found no generator for the carrier.", "NRCarriers[" + std::to_string(carrierIndex) + "]");
    auto& carrier = *generators[static_cast<std::size_t>(carrierIndex)];
    if (!carrier.carrier) return;
    const auto type = carrier.carrier->CarrierType->getValue();
    if (type != Models::Nr5g::CarrierType::DL && type != Models::Nr5g::CarrierType::UL) return;
    const std::string direction = type == Models::Nr5g::CarrierType::DL ? "DL_Tx" : "UL_Tx";
    for (int n = 0; n < carrier.numerologyCount && n < static_cast<int>(carrier.numerologies.size()); ++n) {
        auto& numerology = carrier.numerologies[static_cast<std::size_t>(n)];
        if (!numerology.hasValidChannel) continue;
        // The uplink channels' stages join here with their generators.
        if (type == Models::Nr5g::CarrierType::DL) exportDownlink(numerology, direction + "_");
        exportFrame(numerology, direction);
    }
}

void TestVectorGenerator::exportDownlink(NR5GNumerologyGenerator& numerology, const std::string& direction) {
    std::vector<char> bits;
    std::vector<int> coded;
    std::vector<std::complex<double>> symbols;
    auto stem = [&](const char* channel, std::size_t item) {
        return outputFolder + direction + channel + std::to_string(item);
    };

    const auto& pbchGenerators = numerology.pbchGenerators;
    bool anySent = false;
    for (const auto* pbch : pbchGenerators) anySent = anySent || !pbch->ReserveOnly;
    if (anySent) {
        Log("Start Export PSS/SSS");
        for (std::size_t i = 0; i < pbchGenerators.size(); ++i) {
            const auto& pbch = *pbchGenerators[i];
            if (pbch.ReserveOnly) continue;
            bits = pbch.Pss;
            SaveBuffer(bits, stem("PBCH", i) + "Pss" + ".txt");
            bits = pbch.Sss;
            SaveBuffer(bits, stem("PBCH", i) + "Sss" + ".txt");
        }
        Log("End Export PSS/SSS");

        Log("Start Export PBCH Data");
        for (std::size_t i = 0; i < pbchGenerators.size(); ++i) {
            const auto& pbch = *pbchGenerators[i];
            if (pbch.ReserveOnly) continue;
            const auto name = stem("PBCH", i);
            bits = pbch.CapturedInterleaved;
            SaveBuffer(bits, name + "_CRC_In.txt");
            bits = pbch.CapturedCrcAttached;
            SaveBuffer(bits, name + "_CRC_Out.txt");
            bits = pbch.CapturedPolar;
            SaveBuffer(bits, name + "_Enc_Out.txt");
            bits = pbch.CapturedRateMatched;
            SaveBuffer(bits, name + "_RM_Out.txt");
            const int block = firstSentBlock(pbch);
            symbols.clear();
            if (block >= 0 && block < static_cast<int>(pbch.PbchSymbols.size()))
                symbols = pbch.PbchSymbols[static_cast<std::size_t>(block)];
            SaveBuffer(symbols, name + "_Mod_Out.txt");
            symbols.clear();
            if (block >= 0 && block < static_cast<int>(pbch.DmrsSymbols.size()))
                symbols = pbch.DmrsSymbols[static_cast<std::size_t>(block)];
            SaveBuffer(symbols, name + "_DMRS.txt");
        }
        Log("End Export PBCH Data");
    }

    if (!numerology.pdcchGenerators.empty()) {
        Log("Start Export PDCCH Data");
        for (std::size_t i = 0; i < numerology.pdcchGenerators.size(); ++i) {
            const int item = static_cast<int>(i);
            const auto name = stem("PDCCH", i);
            numerology.GetPDCCHBeforeCrc(item, bits);
            SaveBuffer(bits, name + "_CRC_In.txt");
            numerology.GetPDCCHAfterCrc(item, bits);
            SaveBuffer(bits, name + "_CRC_Out.txt");
            numerology.GetPDCCHAfterPolar(item, bits);
            SaveBuffer(bits, name + "_Enc_Out.txt");
            numerology.GetPDCCHAfterRateMatching(item, bits);
            SaveBuffer(bits, name + "_RM_Out.txt");
            numerology.GetPDCCHAfterMap(item, symbols);
            SaveBuffer(symbols, name + "_Mod_Out.txt");
            numerology.GetPdcchDmrs(item, symbols);
            SaveBuffer(symbols, name + "_DMRS.txt");
        }
        Log("End Export PDCCH Data");
    }

    if (!numerology.pdschGenerators.empty()) {
        Log("Start Export PDSCH Data");
        for (std::size_t i = 0; i < numerology.pdschGenerators.size(); ++i) {
            const int item = static_cast<int>(i);
            const auto name = stem("PDSCH", i);
            numerology.GetPDSCHBeforeCrc(item, bits);
            SaveBuffer(bits, name + "_CRC_In.txt");
            numerology.GetPDSCHAfterCrc(item, bits);
            SaveBuffer(bits, name + "_CRC_Out.txt");
            numerology.GetPDSCHAfterLdpc(item, coded);
            SaveBuffer(coded, name + "_Enc_Out.txt");
            numerology.GetPDSCHAfterRateMatching(item, coded);
            SaveBuffer(coded, name + "_RM_Out.txt");
            numerology.GetPDSCHAfterMap(item, symbols);
            SaveBuffer(symbols, name + "_Mod_Out.txt");
            numerology.GetPdschDmrs(item, symbols);
            SaveBuffer(symbols, name + "_DMRS.txt");
        }
        Log("End Export PDSCH Data");
    }

    if (!numerology.csiRsGenerators.empty()) {
        Log("Start Export CSI-RS Data");
        for (std::size_t i = 0; i < numerology.csiRsGenerators.size(); ++i) {
            const auto name = stem("CSI_RS", i);
            numerology.GetCsiRsSeqence(static_cast<int>(i), bits);
            SaveBuffer(bits, name + "_Sequence.txt");
            numerology.GetCsiRsMapped(static_cast<int>(i), symbols);
            SaveBuffer(symbols, name + "_Mod_Out.txt");
        }
        Log("End Export CSI-RS Data");
    }

    if (!numerology.prsGenerators.empty()) {
        Log("Start Export PRS Data");
        for (std::size_t i = 0; i < numerology.prsGenerators.size(); ++i) {
            numerology.GetPrsData(static_cast<int>(i), symbols);
            SaveBuffer(symbols, stem("PRS", i) + "_Out.txt");
        }
        Log("End Export PRS Data");
    }
}

void TestVectorGenerator::exportFrame(NR5GNumerologyGenerator& numerology, const std::string& direction) {
    std::vector<std::complex<double>> samples;
    for (int a = 0; a < static_cast<int>(numerology.grid.size()); ++a) {
        Log("Start Export MUX Data");
        numerology.GetMuxOut(samples, a);
        SaveBuffer(samples, outputFolder + direction + "_Mux_Ant" + std::to_string(a) + "_Mux_Out.txt");
        Log("End Export MUX Data");
    }
    for (int a = 0; a < static_cast<int>(numerology.cpAddedFrame.size()); ++a) {
        Log("Start Export IQ Data");
        numerology.GetCpAdded(samples, a);
        SaveBuffer(samples, outputFolder + direction + "_CPAdd_Ant" + std::to_string(a) + "_CPAdd_Out.txt");
        Log("End Export IQ Data");
    }
}

void TestVectorGenerator::SaveBuffer(std::vector<char>& data, std::string fileName) {
    // Printed as numbers; a signed byte keeps the -1 of the synchronisation sequences.
    std::vector<signed char> values(data.begin(), data.end());
    saveIntegers(values, fileName);
}

void TestVectorGenerator::SaveBuffer(std::vector<int>& data, std::string fileName) { saveIntegers(data, fileName); }

void TestVectorGenerator::SaveBuffer(std::vector<std::complex<double>>& data, std::string fileName) {
    std::ofstream out(fileName, std::ios::out | std::ios::trunc);
    if (!out) return;
    // A frame has far more lines than one formatting call should build: the text goes out one
    // block of samples at a time, each block in one write.
    std::string text;
    char line[64];
    for (std::size_t start = 0; start < data.size(); start += kSamplesPerWrite) {
        const std::size_t end = std::min(data.size(), start + kSamplesPerWrite);
        text.clear();
        for (std::size_t i = start; i < end; ++i) {
            const auto& sample = data[i];
            if (sample.real() == 0.0 && sample.imag() == 0.0) {
                text += "0 0\n";
                continue;
            }
            const int length = std::snprintf(line, sizeof line, "%0.6g %0.6g\n", sample.real(), sample.imag());
            text.append(line, static_cast<std::size_t>(length));
        }
        out.write(text.data(), static_cast<std::streamsize>(text.size()));
    }
}

}  // namespace Orvalis_NR
