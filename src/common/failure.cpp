#include "common/failure.h"

namespace Orvalis_NR {

namespace {

// One text per thread: generation is single-threaded, and a host that runs two engines on two
// threads still gets each its own text.
std::string& failureText() {
    thread_local std::string text;
    return text;
}

}  // namespace

void fail(std::string text) {
    std::string& kept = failureText();
    kept = std::move(text);
    throw static_cast<const char*>(kept.c_str());
}

void failWith(const char* text, const std::string& detail) {
    fail(detail.empty() ? std::string(text) : std::string(text) + " " + detail);
}

}  // namespace Orvalis_NR
