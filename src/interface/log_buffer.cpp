#include "interface/log_buffer.h"

#include <cstring>

namespace Orvalis_NR {

void appendLog(char* buffer, int& length, const char* text, bool restart) {
    if (text == nullptr) text = "";
    const std::size_t textLength = std::strlen(text) + 1;  // with the terminating NUL
    int position = 0;
    if (restart) {
        length = 0;
    } else if (static_cast<std::size_t>(length) + (length >= 1 ? 1 : 0) + textLength <= kLogCapacity) {
        // The separator takes one byte more than the NUL it replaces: an entry that would
        // bring the log to 4097 bytes does not fit.
        if (length >= 1) {
            buffer[length - 1] = '\r';
            buffer[length] = '\n';
            length += 1;
            position = length;
        }
    } else {
        length = 0;  // does not fit: the whole log is dropped and the entry starts it anew
    }
    const std::size_t room = static_cast<std::size_t>(kLogCapacity - position);
    const std::size_t copied = textLength <= room ? textLength : room;
    std::memcpy(buffer + position, text, copied - 1);
    buffer[position + static_cast<int>(copied) - 1] = '\0';
    length = position + static_cast<int>(copied);
}

}  // namespace Orvalis_NR
