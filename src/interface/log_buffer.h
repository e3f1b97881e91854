#pragma once
// The status log that the host reads through GetLog: entries separated by CR LF, one NUL at the
// end, at most 4096 bytes. The buffer's address never changes.

#include <cstddef>

namespace Orvalis_NR {

inline constexpr int kLogCapacity = 4096;

/// Appends `text` to the log (or starts the log afresh with it when `restart` is true). An entry
/// that would not fit throws the earlier log away and starts a new one. A text longer than the
/// whole buffer is cut to fit, so the buffer is never overrun.
void appendLog(char* buffer, int& length, const char* text, bool restart);

}  // namespace Orvalis_NR
