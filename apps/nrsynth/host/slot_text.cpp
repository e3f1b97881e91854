#include "host/slot_text.h"

#include <charconv>
#include <stdexcept>

namespace nrsynth_host {
namespace {

// 960 kHz spacing has 640 slots in a frame, the most of any numerology.
constexpr int kLargestSlot = 639;

std::string trimmed(const std::string& text) {
    const auto first = text.find_first_not_of(" \t");
    if (first == std::string::npos) return {};
    const auto last = text.find_last_not_of(" \t");
    return text.substr(first, last - first + 1);
}

int slotNumber(const std::string& text, const std::string& item) {
    const std::string digits = trimmed(text);
    int value = 0;
    const auto [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), value);
    if (digits.empty() || error != std::errc() || end != digits.data() + digits.size() || value < 0)
        throw std::invalid_argument("\"" + item + "\" is not a slot, a range a:b or a stepped range a:b:s");
    return value;
}

std::vector<std::string> split(const std::string& text, char separator) {
    std::vector<std::string> parts;
    std::size_t start = 0;
    while (true) {
        const auto end = text.find(separator, start);
        parts.push_back(text.substr(start, end == std::string::npos ? std::string::npos : end - start));
        if (end == std::string::npos) return parts;
        start = end + 1;
    }
}

}  // namespace

std::vector<int> parseSlotText(const std::string& typed) {
    std::vector<int> slots;
    if (trimmed(typed).empty()) return slots;
    for (const auto& rawItem : split(typed, ',')) {
        const std::string item = trimmed(rawItem);
        const auto bounds = split(item, ':');
        if (bounds.size() > 3) throw std::invalid_argument("\"" + item + "\" has more than two colons");
        const int first = slotNumber(bounds[0], item);
        const int last = bounds.size() > 1 ? slotNumber(bounds[1], item) : first;
        const int step = bounds.size() > 2 ? slotNumber(bounds[2], item) : 1;
        if (last > kLargestSlot)
            throw std::invalid_argument("\"" + item + "\" reaches past slot " + std::to_string(kLargestSlot) +
                                        ", the last slot of any frame");
        if (last < first) throw std::invalid_argument("\"" + item + "\" ends before it starts");
        if (step == 0) throw std::invalid_argument("\"" + item + "\" has a step of 0");
        for (long long slot = first; slot <= last; slot += step) slots.push_back(static_cast<int>(slot));
    }
    return slots;
}

std::string expandSlotText(const std::string& typed, int slotsPerFrame, int frames) {
    const auto slots = parseSlotText(typed);
    for (int slot : slots)
        if (slot >= slotsPerFrame)
            throw std::invalid_argument("slot " + std::to_string(slot) + " is past the " + std::to_string(slotsPerFrame) +
                                        " slots of a frame");
    std::string list;
    for (int frame = 0; frame < frames; ++frame)
        for (int slot : slots) {
            if (!list.empty()) list += ',';
            list += std::to_string(frame * slotsPerFrame + slot);
        }
    return list;
}

}  // namespace nrsynth_host
