#pragma once
// One numerology of a carrier: its frame geometry, its channel generators, its frame store,
// OFDM modulator and baseband filter. A numerology without a channel stays idle. Go turns one
// radio frame of it into samples at the waveform's rate.

#include <atomic>
#include <complex>
#include <memory>
#include <string>
#include <vector>

#include "dsp/filter.h"
#include "dsp/ofdm_modulator.h"
#include "dsp/slot_grid.h"
#include "models/nr5g_waveform_settings.h"

namespace Orvalis_NR {

class CSI_RS_Generator;
class PBCH_Generator;
class PDCCH_Generator;
class PDSCH_Generator;
class PRS_Generator;

/// Places of the channel kinds in a count vector.
enum ChannelPlace { PlacePBCH, PlacePDSCH, PlacePDCCH, PlaceCSIRS, PlacePUSCH, PlacePUCCH, PlaceSRS, PlacePRS };

class NR5GNumerologyGenerator {
public:
    NR5GNumerologyGenerator() = default;
    ~NR5GNumerologyGenerator();
    NR5GNumerologyGenerator(const NR5GNumerologyGenerator&) = delete;
    NR5GNumerologyGenerator& operator=(const NR5GNumerologyGenerator&) = delete;
    NR5GNumerologyGenerator(NR5GNumerologyGenerator&&) = delete;
    NR5GNumerologyGenerator& operator=(NR5GNumerologyGenerator&&) = delete;

    /// Geometry of numerology `numerology` (0..5, the position of Numerology) at the waveform's
    /// sample rate, and the channels of the carrier that use it.
    void Init(Models::Nr5g::NR5GWaveformSettings& settings, Models::Nr5g::NRCarrier& carrier, int numerology);
    /// One frame of this numerology into `output` (per antenna, one frame at the waveform rate;
    /// every sample is written, zero where no symbol lies) and its marker words ORed into
    /// `sampleMarkers`. A cancelled frame leaves `output` undefined.
    void Go(int frame, int numberOfFrames, std::vector<std::vector<std::complex<double>>>& output,
            std::vector<std::vector<int>>& sampleMarkers);
    /// Reserves the LTE cell reference signals of spectrum sharing in `occupancy`.
    void MarkUnavailable();
    /// Rewinds the payload sources of all channels.
    void ResetDataSource();
    /// Number of channel generators per place of `channelOrder`; a placeholder PBCH does not count.
    std::vector<int> countChannels() const;

    // Copies of the stages that a channel item kept from its last slot, for the data export.
    // `item` is the item's index in its generator vector; an index outside it fails.
    void GetPDCCHBeforeCrc(int item, std::vector<char>& data);
    void GetPDCCHAfterCrc(int item, std::vector<char>& data);
    void GetPDCCHAfterPolar(int item, std::vector<char>& data);
    void GetPDCCHAfterRateMatching(int item, std::vector<char>& data);
    void GetPDCCHAfterMap(int item, std::vector<std::complex<double>>& data);
    void GetPdcchDmrs(int item, std::vector<std::complex<double>>& data);
    /// PDSCH stages of every code word in turn (the second follows the first).
    void GetPDSCHBeforeCrc(int item, std::vector<char>& data);
    void GetPDSCHAfterCrc(int item, std::vector<char>& data);
    /// Output of the last code block encoded, -2 at the filler positions.
    void GetPDSCHAfterLdpc(int item, std::vector<int>& data);
    /// All code blocks' rate-matched (and bit-interleaved) outputs, joined.
    void GetPDSCHAfterRateMatching(int item, std::vector<int>& data);
    /// Modulated symbols in modulation order, before their split into layers.
    void GetPDSCHAfterMap(int item, std::vector<std::complex<double>>& data);
    /// DM-RS values of the slot: DM-RS symbol by symbol, port by port.
    void GetPdschDmrs(int item, std::vector<std::complex<double>>& data);
    void GetCsiRsSeqence(int item, std::vector<char>& data);
    void GetCsiRsMapped(int item, std::vector<std::complex<double>>& data);
    void GetPrsData(int item, std::vector<std::complex<double>>& data);
    /// Row `antenna` of the frame store, and of the kept frame after the cyclic prefix.
    void GetMuxOut(std::vector<std::complex<double>>& data, int antenna);
    void GetCpAdded(std::vector<std::complex<double>>& data, int antenna);

    bool isPrimary = false;
    int numberOfAntennas = 0;
    bool hasValidChannel = false;
    Models::Nr5g::NRCarrier* carrier = nullptr;
    Models::Nr5g::NR5GWaveformSettings* settings = nullptr;
    OfdmModulator modulator;
    SlotGrid grid;
    OccupancyGrid occupancy;
    int numerology = 0;
    int cellId = 0;
    int fftSize = 0;
    std::vector<int> cpLengths;
    int symbolsPerFrame = 0;
    int symbolsPerSlot = 0;
    int slotsPerSubframe = 0;
    int reservedGeometry = 0;
    bool extendedCp = false;
    int mu = 0;
    double sampleRate = 0.0;
    std::vector<int> channelCounts;
    int channelOrder[8] = {0, 1, 2, 3, 4, 5, 6, 7};
    std::vector<PBCH_Generator*> pbchGenerators;
    std::vector<PDCCH_Generator*> pdcchGenerators;
    std::vector<PDSCH_Generator*> pdschGenerators;
    std::vector<CSI_RS_Generator*> csiRsGenerators;
    std::vector<PRS_Generator*> prsGenerators;
    std::vector<std::shared_ptr<Filter>> filters;
    int sampleDelay = 0;
    std::atomic<char> cancelRequested{0};
    std::vector<std::vector<std::complex<double>>> cpAddedFrame;
    char testVectorEnabled = 0;

private:
    void buildDownlinkChannels();
    /// Element `index` of Downlink.BWP; fails naming `item` when there is none.
    std::shared_ptr<Models::Nr5g::NRDLBWP> downlinkBwp(int index, const std::string& item) const;
    void buildReferenceSignals();
    void buildPdschChannels();
    /// Runs the CSI-RS generators that puncture the data (true) or that it rate-matches around.
    bool mapCsiRs(int frame, bool puncture, bool& anyMapped);
    bool mapPrs(int frame, bool& anyMapped);
    void designFilter();
    int filterGuard() const;
    bool takeCancel();
    void blankOutsideWaveform();
    void deriveMarkers(const std::vector<std::vector<int>>& symbolMarks, std::vector<std::vector<int>>& sampleMarkers,
                       int markerExtension);

    int lowestSubcarrier = 360000;
    int highestSubcarrier = 0;
    bool transformPrecoded = false;
    std::vector<std::vector<int>> symbolMarks;  // per antenna, one word per symbol of the frame
    bool storesClear = false;                   // grid and occupancy hold zeros only
    std::size_t modulatedLength = 0;            // samples the symbols of a frame cover
};

}  // namespace Orvalis_NR
