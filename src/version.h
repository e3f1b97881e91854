#pragma once

namespace Orvalis_NR {

/// Version text of the library, "major.minor.patch".
const char* libraryVersion();

}  // namespace Orvalis_NR
