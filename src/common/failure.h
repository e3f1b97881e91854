#pragma once
// The one failure of the library that crosses a layer: a thrown NUL-terminated text. Only the
// host boundary (InitEngine, RunEngine, NR5GEngineWrapper's callers) catches it, as
// `const char*`, and turns it into status -1 and a log line. The text stays valid until the
// next failure on the same thread, so it can name the setting and the value concerned.

#include <string>

namespace Orvalis_NR {

/// Throws `text` as a `const char*` kept alive by the library.
[[noreturn]] void fail(std::string text);

/// Throws the fixed `text`, followed by a blank and `detail` when there is one
/// (the setting, value or file concerned).
[[noreturn]] void failWith(const char* text, const std::string& detail = {});

}  // namespace Orvalis_NR
