// The shared library holds no code of its own: it is the whole of the subsystem archives.
#include "version.h"
