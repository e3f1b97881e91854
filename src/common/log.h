#pragma once
// The logging hook of the generators. Their start and end lines are dropped: the only log a
// host sees is the status log of the plain-function interface.

#include <string>

namespace Orvalis_NR {

inline void Log(const std::string&) {}

}  // namespace Orvalis_NR
