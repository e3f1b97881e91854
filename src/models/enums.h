#pragma once
// The enumerations of the NR settings models. The value of an enumerator is its position in
// the table; the table text and the display names stay in step with the enumerators.

#include <array>
#include <string>

#include "framework/enum_setting.h"

namespace Models::Nr5g {

/// Channel bandwidth of a carrier. The default of `NRCarrier` is `FR1_100M`.
enum class Bandwidth : int {
    FR1_5M,
    FR1_10M,
    FR1_15M,
    FR1_20M,
    FR1_25M,
    FR1_30M,
    FR1_40M,
    FR1_50M,
    FR1_60M,
    FR1_70M,
    FR1_80M,
    FR1_90M,
    FR1_100M,
    FR2_50M,
    FR2_100M,
    FR2_200M,
    FR2_400M
};

/// Selects the mode of the waveform: playback of a generated waveform, or the real-time uplink mode
/// that uses `NRCarriersRT`.
enum class CapabilityEnum : int { Arb, Realtime };

/// Kind of a carrier: downlink, uplink, a PRACH carrier or a continuous wave.
enum class CarrierType : int { DL, UL, PRACH, CW };

/// MIB field cellBarred.
enum class CellBarred : int { barred, notBarred };

/// CCE-to-REG mapping of a CORESET.
enum class CoresetCceMappingType : int { NonInterleaved, Interleaved };

/// CSI-RS frequency density: 0.5, 1 or 3 resource elements per port per PRB.
enum class CSIRSDensity : int { Dot5, One, Three };

/// Cyclic prefix.
enum class CyclicPrefixType : int { Normal, Extended };

/// Format of a DCI.
enum class DCIFormat : int { Format0_0, Format0_1, Format1_0, Format1_1 };

/// Command format of the real-time uplink interface.
enum class DedicatedCommandType : int { Qvr8bit, R16, R16Conv };

/// MCS table of a PDSCH, by the clause of TS 38.214.
enum class DLSCHMCSTable : int { Table51311, Table51312, Table51313 };

/// DM-RS configuration type.
enum class DMRSConfigurationType : int { Type1, Type2 };

/// Length of the front-loaded DM-RS.
enum class DMRSDuration : int { SingleSymbol, DoubleSymbol };

/// Reference point of the DM-RS sequence mapping.
enum class DMRSMappingReference : int { CRB0, CORESET0 };

/// Position of the first DM-RS symbol in type A mapping; `Mib` takes it from the MIB.
enum class DMRStypeAposEnum : int { Pos2, Pos3, Mib };

/// PUSCH frequency hopping.
enum class FrequencyHoppingMode : int { Disabled, Intraslot, Interslot };

/// Where the real-time uplink takes its HARQ feedback from.
enum class HarqDataSource : int { Internal, External };

/// A HARQ feedback value.
enum class HarqValue : int { ACK, NACK, None };

/// MIB field intraFreqReselection.
enum class IntraFreqReselection : int { allowed, notAllowed };

/// Bandwidth of a coexisting LTE carrier.
enum class LTEBandwidth : int {
    BW1p4M_6RB,
    BW3M_15RB,
    BW5M_25RB,
    BW10M_50RB,
    BW15M_75RB,
    BW20M_100RB
};

/// What a marker output carries.
enum class MarkerType : int { WaveformStart, FrameStart, AlcControl, RfBlanking };

/// Minimum channel bandwidth for the CORESET 0 tables of the initial BWP.
enum class MinimumChannelBandwidth : int { _5or10MHz, _40MHz };

/// Modulation of a shared channel. `BPSK` is pi/2 BPSK.
enum class ModulationType : int { BPSK, QPSK, PSK8, QAM16, QAM64, QAM256, QAM1024 };

/// Subcarrier spacing and numerology. The display names begin with the micro sign, in UTF-8.
enum class Numerology : int { SCS15k, SCS30k, SCS60kNCP, SCS60kECP, SCS120k, SCS240k };

/// Whether a carrier uses one numerology or several.
enum class NumerologyMode : int { SingleNumerology, MultipleNumerologies };

/// Data source of a channel. `Pattern` uses `PatternBits`, `UserFile` uses `UserFile`.
enum class PayloadDataType : int { PN9, PN15, PN23, PN31, Pattern, UserFile };

/// Search space of a PDCCH.
enum class PDCCHSearchSpace : int { UESpecific, Common };

/// PDSCH mapping type.
enum class PDSCHMappingType : int { A, B };

/// Phase compensation of the carrier.
enum class PhaseCompensationMode : int { Auto, Manual, Off, AutoRT, ManualRT };

/// What the power settings of a carrier refer to.
enum class PowerDefinitionType : int { TotalPower, SSRSRP };

/// Table of TS 38.211 from which `ConfigurationIndex` is read.
enum class PRACHConfigurationTable : int {
    FR1_PairedSpectrum,
    FR1_UnpairedSpectrum,
    FR2_UnpairedSpectrum
};

/// PRACH preamble format. The last three stand for the combined formats.
enum class PRACHFormat : int {
    Format0,
    Format1,
    Format2,
    Format3,
    FormatA0,
    FormatA1,
    FormatA2,
    FormatA3,
    FormatB1,
    FormatB2,
    FormatB3,
    FormatB4,
    FormatC0,
    FormatC2,
    FormatA1B1,
    FormatA2B2,
    FormatA3B3
};

/// Restricted set of a long PRACH sequence.
enum class PRACHRestrictedSetConfig : int {
    UnrestrictedSet,
    RestrictedSetTypeA,
    RestrictedSetTypeB
};

/// PRACH subcarrier spacing. `SCS1250` is 1.25 kHz and `SCS5k` is 5 kHz; the order is as told, not
/// ascending.
enum class PRACHSubcarrierSpacing : int { SCS15k, SCS30k, SCS60k, SCS120k, SCS1250, SCS5k };

/// Which PRBs of a 0.5-density CSI-RS are used.
enum class PRBAllocation : int { EvenPRBs, OddPRBs };

/// PRB bundling size.
enum class PRBBundleSize : int { _2RB, _4RB, Wideband };

/// Precoder granularity of a CORESET.
enum class PrecoderGranularity : int { REGBundleSize, CORESETSize };

/// PT-RS resource element offset.
enum class PTRSREOffset : int { Offset00, Offset01, Offset10, Offset11 };

/// PUCCH format.
enum class PUCCHFormat : int { Format0, Format1, Format2, Format3, Format4 };

/// PUCCH group hopping. The names are as told: `Neither` first, `Enabled` next, `Disabled` last.
enum class PUCCHGroupHopping : int { Neither, Enabled, Disabled };

/// Maximum code rate of a PUCCH. The last enumerator is deliberately `codeRate080`, with a small
/// letter.
enum class PUCCHMaxCodeRate : int {
    CodeRate008,
    CodeRate015,
    CodeRate025,
    CodeRate035,
    CodeRate045,
    CodeRate060,
    codeRate080
};

/// PUSCH mapping type.
enum class PUSCHMappingType : int { A, B };

/// Scope of a rate-match pattern.
enum class RateMatchPatternLevel : int { Cell, BWP };

/// Resource allocation type.
enum class RAType : int { RAType0, RAType1, RAType2 };

/// Type of RNTI a DCI uses.
enum class RNTIType : int { SI_RNTI, P_RNTI, RA_RNTI, TC_RNTI, C_RNTI };

/// Scheduling request state on PUCCH format 0 or 1.
enum class SRConfiguration : int { Negative, Positive };

/// First-symbol alternative for the 30 kHz SS/PBCH pattern. The display names are the formulas as
/// text.
enum class SSB30KSymbolIndex : int { Option0, Option1 };

/// SS/PBCH block pattern of TS 38.213.
enum class SSBlockPattern : int { CaseA, CaseB, CaseC, CaseD, CaseE };

/// SS burst period.
enum class SSBPeriod : int { HalfFrame, OneFrame, TwoFrame, FourFrame, EightFrame, SixteenFrame };

/// Plain subcarrier spacing, unlike `Numerology` with no 60 kHz extended entry.
enum class SubcarrierSpacing : int { SCS15k, SCS30k, SCS60k, SCS120k, SCS240k };

/// Whether a rate-match symbol bitmap spans one or two slots.
enum class SymbolBitmapSpan : int { OneSlot, TwoSlots };

/// MCS table of a PUSCH, by the clause of TS 38.214. Tables for transform precoding stand between
/// the others.
enum class ULSCHMCSTable : int { Table51311, Table51312, Table61411, Table51313, Table61412 };

/// VRB-to-PRB mapping.
enum class VRBtoPRBMapping : int { NonInterleaved, Interleaved };

/// Where the OFDM symbol window is centred.
enum class WindowingMethod : int { CenteredAtSymbolBoundary, StartingAtSymbolBoundary };

/// Enumerator name of a numerology ("SCS30k").
std::string toString(Numerology numerology);

/// Gives every enumeration its display names.
void registerEnumerationDisplayNames();

/// Runs registerEnumerationDisplayNames once; called at load by every program that includes
/// this header, which every model header does.
bool registerEnumerations();

namespace detail {
inline const bool enumerationsRegistered = registerEnumerations();
}  // namespace detail

}  // namespace Models::Nr5g

namespace Orvalis::Tessaline {

template <>
struct EnumInfo<Models::Nr5g::Bandwidth> {
    static constexpr const char* table =
        "FR1_5M, FR1_10M, FR1_15M, FR1_20M, FR1_25M, FR1_30M, FR1_40M, FR1_50M, FR1_60M, FR1_70M, "
        "FR1_80M, FR1_90M, FR1_100M, FR2_50M, FR2_100M, FR2_200M, FR2_400M";
    static constexpr std::array<const char*, 17> displayNames{
        "FR1 5MHz",   "FR1 10MHz", "FR1 15MHz",  "FR1 20MHz",  "FR1 25MHz", "FR1 30MHz",
        "FR1 40MHz",  "FR1 50MHz", "FR1 60MHz",  "FR1 70MHz",  "FR1 80MHz", "FR1 90MHz",
        "FR1 100MHz", "FR2 50MHz", "FR2 100MHz", "FR2 200MHz", "FR2 400MHz"};
};
template <>
struct EnumInfo<Models::Nr5g::CapabilityEnum> {
    static constexpr const char* table = "Arb, Realtime";
    static constexpr std::array<const char*, 2> displayNames{"Waveform Playback",
                                                             "Real-time Uplink"};
};
template <>
struct EnumInfo<Models::Nr5g::CarrierType> {
    static constexpr const char* table = "DL, UL, PRACH, CW";
    static constexpr std::array<const char*, 4> displayNames{"Downlink", "Uplink", "PRACH",
                                                             "ContinuousWave"};
};
template <>
struct EnumInfo<Models::Nr5g::CellBarred> {
    static constexpr const char* table = "barred, notBarred";
    static constexpr std::array<const char*, 2> displayNames{"0: barred", "1: notBarred"};
};
template <>
struct EnumInfo<Models::Nr5g::CoresetCceMappingType> {
    static constexpr const char* table = "NonInterleaved, Interleaved";
    static constexpr std::array<const char*, 2> displayNames{"Non-Interleaved", "Interleaved"};
};
template <>
struct EnumInfo<Models::Nr5g::CSIRSDensity> {
    static constexpr const char* table = "Dot5, One, Three";
    static constexpr std::array<const char*, 3> displayNames{"0.5", "1", "3"};
};
template <>
struct EnumInfo<Models::Nr5g::CyclicPrefixType> {
    static constexpr const char* table = "Normal, Extended";
    static constexpr std::array<const char*, 2> displayNames{"Normal", "Extended"};
};
template <>
struct EnumInfo<Models::Nr5g::DCIFormat> {
    static constexpr const char* table = "Format0_0, Format0_1, Format1_0, Format1_1";
    static constexpr std::array<const char*, 4> displayNames{"Format 0_0", "Format 0_1",
                                                             "Format 1_0", "Format 1_1"};
};
template <>
struct EnumInfo<Models::Nr5g::DedicatedCommandType> {
    static constexpr const char* table = "Qvr8bit, R16, R16Conv";
    static constexpr std::array<const char*, 3> displayNames{"QVR 8 bit", "R16",
                                                             "R16 with External Converter"};
};
template <>
struct EnumInfo<Models::Nr5g::DLSCHMCSTable> {
    static constexpr const char* table = "Table51311, Table51312, Table51313";
    static constexpr std::array<const char*, 3> displayNames{
        "Table 5.1.3.1-1 (64QAM)", "Table 5.1.3.1-2 (256QAM)", "Table 5.1.3.1-3 (64QAMLowSE)"};
};
template <>
struct EnumInfo<Models::Nr5g::DMRSConfigurationType> {
    static constexpr const char* table = "Type1, Type2";
    static constexpr std::array<const char*, 2> displayNames{"Type 1", "Type 2"};
};
template <>
struct EnumInfo<Models::Nr5g::DMRSDuration> {
    static constexpr const char* table = "SingleSymbol, DoubleSymbol";
    static constexpr std::array<const char*, 2> displayNames{"Single Symbol", "Double Symbol"};
};
template <>
struct EnumInfo<Models::Nr5g::DMRSMappingReference> {
    static constexpr const char* table = "CRB0, CORESET0";
    static constexpr std::array<const char*, 2> displayNames{"CRB0", "CORESET0"};
};
template <>
struct EnumInfo<Models::Nr5g::DMRStypeAposEnum> {
    static constexpr const char* table = "Pos2, Pos3, Mib";
    static constexpr std::array<const char*, 3> displayNames{"2", "3", "MIB"};
};
template <>
struct EnumInfo<Models::Nr5g::FrequencyHoppingMode> {
    static constexpr const char* table = "Disabled, Intraslot, Interslot";
    static constexpr std::array<const char*, 3> displayNames{
        "Disabled", "Intra-slot Frequency hopping", "Inter-slot Frequency hopping"};
};
template <>
struct EnumInfo<Models::Nr5g::HarqDataSource> {
    static constexpr const char* table = "Internal, External";
    static constexpr std::array<const char*, 2> displayNames{"Internal", "External"};
};
template <>
struct EnumInfo<Models::Nr5g::HarqValue> {
    static constexpr const char* table = "ACK, NACK, None";
    static constexpr std::array<const char*, 3> displayNames{"ACK", "NACK", "None"};
};
template <>
struct EnumInfo<Models::Nr5g::IntraFreqReselection> {
    static constexpr const char* table = "allowed, notAllowed";
    static constexpr std::array<const char*, 2> displayNames{"0: allowed", "1: notAllowed"};
};
template <>
struct EnumInfo<Models::Nr5g::LTEBandwidth> {
    static constexpr const char* table =
        "BW1p4M_6RB, BW3M_15RB, BW5M_25RB, BW10M_50RB, BW15M_75RB, BW20M_100RB";
    static constexpr std::array<const char*, 6> displayNames{"1.4 MHz (6RB)", "3 MHz (15RB)",
                                                             "5 MHz (25RB)",  "10 MHz (50RB)",
                                                             "15 MHz (75RB)", "20 MHz (100RB)"};
};
template <>
struct EnumInfo<Models::Nr5g::MarkerType> {
    static constexpr const char* table = "WaveformStart, FrameStart, AlcControl, RfBlanking";
    static constexpr std::array<const char*, 4> displayNames{
        "Waveform Start", "Frame Start", "RF ALC Control", "RF Blanking Control"};
};
template <>
struct EnumInfo<Models::Nr5g::MinimumChannelBandwidth> {
    static constexpr const char* table = "_5or10MHz, _40MHz";
    static constexpr std::array<const char*, 2> displayNames{"5 MHz or 10 MHz", "40 MHz"};
};
template <>
struct EnumInfo<Models::Nr5g::ModulationType> {
    static constexpr const char* table = "BPSK, QPSK, PSK8, QAM16, QAM64, QAM256, QAM1024";
    static constexpr std::array<const char*, 7> displayNames{
        "pi/2 BPSK", "QPSK", "8PSK", "16QAM", "64QAM", "256QAM", "1024QAM"};
};
template <>
struct EnumInfo<Models::Nr5g::Numerology> {
    static constexpr const char* table = "SCS15k, SCS30k, SCS60kNCP, SCS60kECP, SCS120k, SCS240k";
    static constexpr std::array<const char*, 6> displayNames{
        "µ = 0: 15 kHz",  "µ = 1: 30 kHz", "µ = 2: 60 kHz Normal CP", "µ = 2: 60 kHz Extended CP",
        "µ = 3: 120 kHz", "µ = 4: 240 kHz"};
};
template <>
struct EnumInfo<Models::Nr5g::NumerologyMode> {
    static constexpr const char* table = "SingleNumerology, MultipleNumerologies";
    static constexpr std::array<const char*, 2> displayNames{"Single Numerology",
                                                             "Multiple Numerologies"};
};
template <>
struct EnumInfo<Models::Nr5g::PayloadDataType> {
    static constexpr const char* table = "PN9, PN15, PN23, PN31, Pattern, UserFile";
    static constexpr std::array<const char*, 6> displayNames{"PN9",  "PN15",           "PN23",
                                                             "PN31", "Custom Pattern", "User File"};
};
template <>
struct EnumInfo<Models::Nr5g::PDCCHSearchSpace> {
    static constexpr const char* table = "UESpecific, Common";
    static constexpr std::array<const char*, 2> displayNames{"UE-Specific", "Common"};
};
template <>
struct EnumInfo<Models::Nr5g::PDSCHMappingType> {
    static constexpr const char* table = "A, B";
    static constexpr std::array<const char*, 2> displayNames{"Type A", "Type B"};
};
template <>
struct EnumInfo<Models::Nr5g::PhaseCompensationMode> {
    static constexpr const char* table = "Auto, Manual, Off, AutoRT, ManualRT";
    static constexpr std::array<const char*, 5> displayNames{
        "Auto", "Manual", "Off", "Auto (Real-time)", "Manual (Real-time)"};
};
template <>
struct EnumInfo<Models::Nr5g::PowerDefinitionType> {
    static constexpr const char* table = "TotalPower, SSRSRP";
    static constexpr std::array<const char*, 2> displayNames{"Total Power", "SS-RSRP"};
};
template <>
struct EnumInfo<Models::Nr5g::PRACHConfigurationTable> {
    static constexpr const char* table =
        "FR1_PairedSpectrum, FR1_UnpairedSpectrum, FR2_UnpairedSpectrum";
    static constexpr std::array<const char*, 3> displayNames{
        "FR1 - Paired Spectrum/Supplementary uplink", "FR1 - Unpaired Spectrum",
        "FR2 - Unpaired Spectrum"};
};
template <>
struct EnumInfo<Models::Nr5g::PRACHFormat> {
    static constexpr const char* table =
        "Format0, Format1, Format2, Format3, FormatA0, FormatA1, FormatA2, FormatA3, FormatB1, "
        "FormatB2, FormatB3, FormatB4, FormatC0, FormatC2, FormatA1B1, FormatA2B2, FormatA3B3";
    static constexpr std::array<const char*, 17> displayNames{
        "Format 0",  "Format 1",  "Format 2",     "Format 3",     "Format A0",   "Format A1",
        "Format A2", "Format A3", "Format B1",    "Format B2",    "Format B3",   "Format B4",
        "Format C0", "Format C2", "Format A1/B1", "Format A2/B2", "Format A3/B3"};
};
template <>
struct EnumInfo<Models::Nr5g::PRACHRestrictedSetConfig> {
    static constexpr const char* table = "UnrestrictedSet, RestrictedSetTypeA, RestrictedSetTypeB";
    static constexpr std::array<const char*, 3> displayNames{
        "Unrestricted set", "Restricted set type A", "Restricted set type B"};
};
template <>
struct EnumInfo<Models::Nr5g::PRACHSubcarrierSpacing> {
    static constexpr const char* table = "SCS15k, SCS30k, SCS60k, SCS120k, SCS1250, SCS5k";
    static constexpr std::array<const char*, 6> displayNames{"15 kHz",  "30 kHz",   "60 kHz",
                                                             "120 kHz", "1.25 kHz", "5 kHz"};
};
template <>
struct EnumInfo<Models::Nr5g::PRBAllocation> {
    static constexpr const char* table = "EvenPRBs, OddPRBs";
    static constexpr std::array<const char*, 2> displayNames{"Even PRBs", "Odd PRBs"};
};
template <>
struct EnumInfo<Models::Nr5g::PRBBundleSize> {
    static constexpr const char* table = "_2RB, _4RB, Wideband";
    static constexpr std::array<const char*, 3> displayNames{"2", "4", "Wideband"};
};
template <>
struct EnumInfo<Models::Nr5g::PrecoderGranularity> {
    static constexpr const char* table = "REGBundleSize, CORESETSize";
    static constexpr std::array<const char*, 2> displayNames{"REG Bundle Size", "CORESET Size"};
};
template <>
struct EnumInfo<Models::Nr5g::PTRSREOffset> {
    static constexpr const char* table = "Offset00, Offset01, Offset10, Offset11";
    static constexpr std::array<const char*, 4> displayNames{"00", "01", "10", "11"};
};
template <>
struct EnumInfo<Models::Nr5g::PUCCHFormat> {
    static constexpr const char* table = "Format0, Format1, Format2, Format3, Format4";
    static constexpr std::array<const char*, 5> displayNames{"Format 0", "Format 1", "Format 2",
                                                             "Format 3", "Format 4"};
};
template <>
struct EnumInfo<Models::Nr5g::PUCCHGroupHopping> {
    static constexpr const char* table = "Neither, Enabled, Disabled";
    static constexpr std::array<const char*, 3> displayNames{"Neither", "Enabled", "Disabled"};
};
template <>
struct EnumInfo<Models::Nr5g::PUCCHMaxCodeRate> {
    static constexpr const char* table =
        "CodeRate008, CodeRate015, CodeRate025, CodeRate035, CodeRate045, CodeRate060, codeRate080";
    static constexpr std::array<const char*, 7> displayNames{"0.08", "0.15", "0.25", "0.35",
                                                             "0.45", "0.60", "0.80"};
};
template <>
struct EnumInfo<Models::Nr5g::PUSCHMappingType> {
    static constexpr const char* table = "A, B";
    static constexpr std::array<const char*, 2> displayNames{"Type A", "Type B"};
};
template <>
struct EnumInfo<Models::Nr5g::RateMatchPatternLevel> {
    static constexpr const char* table = "Cell, BWP";
    static constexpr std::array<const char*, 2> displayNames{"Cell Level", "BWP Level"};
};
template <>
struct EnumInfo<Models::Nr5g::RAType> {
    static constexpr const char* table = "RAType0, RAType1, RAType2";
    static constexpr std::array<const char*, 3> displayNames{"Type 0", "Type 1", "Type 2"};
};
template <>
struct EnumInfo<Models::Nr5g::RNTIType> {
    static constexpr const char* table = "SI_RNTI, P_RNTI, RA_RNTI, TC_RNTI, C_RNTI";
    static constexpr std::array<const char*, 5> displayNames{
        "SI-RNTI", "P-RNTI", "RA-RNTI", "TC-RNTI", "C-RNTI/CS-RNTI/MCS-C-RNTI"};
};
template <>
struct EnumInfo<Models::Nr5g::SRConfiguration> {
    static constexpr const char* table = "Negative, Positive";
    static constexpr std::array<const char*, 2> displayNames{"Negative", "Positive"};
};
template <>
struct EnumInfo<Models::Nr5g::SSB30KSymbolIndex> {
    static constexpr const char* table = "Option0, Option1";
    static constexpr std::array<const char*, 2> displayNames{"{4,8,16,20} + 28*n", "{2,8} + 14*n"};
};
template <>
struct EnumInfo<Models::Nr5g::SSBlockPattern> {
    static constexpr const char* table = "CaseA, CaseB, CaseC, CaseD, CaseE";
    static constexpr std::array<const char*, 5> displayNames{"Case A", "Case B", "Case C", "Case D",
                                                             "Case E"};
};
template <>
struct EnumInfo<Models::Nr5g::SSBPeriod> {
    static constexpr const char* table =
        "HalfFrame, OneFrame, TwoFrame, FourFrame, EightFrame, SixteenFrame";
    static constexpr std::array<const char*, 6> displayNames{"5 ms",  "10 ms", "20 ms",
                                                             "40 ms", "80 ms", "160 ms"};
};
template <>
struct EnumInfo<Models::Nr5g::SubcarrierSpacing> {
    static constexpr const char* table = "SCS15k, SCS30k, SCS60k, SCS120k, SCS240k";
    static constexpr std::array<const char*, 5> displayNames{"15 kHz", "30 kHz", "60 kHz",
                                                             "120 kHz", "240 kHz"};
};
template <>
struct EnumInfo<Models::Nr5g::SymbolBitmapSpan> {
    static constexpr const char* table = "OneSlot, TwoSlots";
    static constexpr std::array<const char*, 2> displayNames{"One Slot", "Two Slots"};
};
template <>
struct EnumInfo<Models::Nr5g::ULSCHMCSTable> {
    static constexpr const char* table =
        "Table51311, Table51312, Table61411, Table51313, Table61412";
    static constexpr std::array<const char*, 5> displayNames{
        "Table 5.1.3.1-1 (64QAM)", "Table 5.1.3.1-2 (256QAM)", "Table 6.1.4.1-1 (64QAM TP)",
        "Table 5.1.3.1-3 (64QAMLowSE)", "Table 6.1.4.1-2 (64QAM TP LowSE)"};
};
template <>
struct EnumInfo<Models::Nr5g::VRBtoPRBMapping> {
    static constexpr const char* table = "NonInterleaved, Interleaved";
    static constexpr std::array<const char*, 2> displayNames{"Non-Interleaved", "Interleaved"};
};
template <>
struct EnumInfo<Models::Nr5g::WindowingMethod> {
    static constexpr const char* table = "CenteredAtSymbolBoundary, StartingAtSymbolBoundary";
    static constexpr std::array<const char*, 2> displayNames{"Centered at Symbol Boundary",
                                                             "Starting at Symbol Boundary"};
};

}  // namespace Orvalis::Tessaline
