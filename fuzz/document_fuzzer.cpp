// libFuzzer target: any bytes as a waveform document through the host interface. The
// library must read it or refuse it with a message, and then run it or refuse it, never crash.

#include <cstddef>
#include <cstdint>
#include <string>

#include "fuzz_run.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    // StartDeserialize takes a NUL-terminated text: an inner NUL ends the document there.
    nrsynth_fuzz::runDocument(std::string(reinterpret_cast<const char*>(data), size),
                              nrsynth_fuzz::Expect::AnyReportedOutcome);
    return 0;
}
