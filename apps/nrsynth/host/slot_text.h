#pragma once
// The slot syntax people type into `SlotIndexStr` and its expansion into `SlotIndexArrayStr`,
// the comma list of absolute slot numbers that the generators read.
//
// Syntax: items separated by commas; an item is a slot "n", an inclusive range "a:b", or a
// stepped range "a:b:s" ("2:8:2" is 2,4,6,8). The slots are those of one frame and repeat in
// every frame of the waveform: slot n of frame f is n + f x slots per frame.

#include <string>
#include <vector>

namespace nrsynth_host {

/// The slots of one frame that `typed` names, in the order written. Throws
/// std::invalid_argument with a text naming the bad item.
std::vector<int> parseSlotText(const std::string& typed);

/// `typed` expanded over `frames` frames of `slotsPerFrame` slots, as a comma list. Slots at or
/// beyond `slotsPerFrame` are an error (std::invalid_argument), since they would land in the
/// next frame's place.
std::string expandSlotText(const std::string& typed, int slotsPerFrame, int frames);

}  // namespace nrsynth_host
