#pragma once
// Host values present in a document that contradict what they are derived from.

#include <nlohmann/json.hpp>

#include "findings.h"

namespace nrsynth_cli::validation {

/// Compares every host value the document writes (`Mu`, `SlotIndexArrayStr`, `LastSymbol`,
/// `TransportBlockSize`, `Modulation`, `CodingRate`) with the value worked out without it.
void checkDerivedValues(const nlohmann::ordered_json& document, FindingList& findings);

}  // namespace nrsynth_cli::validation
