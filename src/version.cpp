#include "version.h"

namespace Orvalis_NR {

const char* libraryVersion() { return "0.1.0"; }

}  // namespace Orvalis_NR
