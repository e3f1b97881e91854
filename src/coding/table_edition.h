#pragma once

namespace Orvalis_NR {

/// Edition of the base-sequence tables: 152 at load; 151 once a waveform whose first bandwidth
/// part name contains "15.1" has been set up, and never set back in the process.
extern int specVersion;

}  // namespace Orvalis_NR
