#pragma once
// Every settings model of a waveform document, and their registration at load.

#include "models/lte_coexistence.h"
#include "models/lte_crs.h"
#include "models/nr5g_waveform_settings.h"
#include "models/nr_carrier.h"
#include "models/nr_carrier_rt.h"
#include "models/nr_coreset.h"
#include "models/nr_csirs.h"
#include "models/nr_dci.h"
#include "models/nr_dl_bwp.h"
#include "models/nr_dlsch.h"
#include "models/nr_downlink.h"
#include "models/nr_mib.h"
#include "models/nr_prach.h"
#include "models/nr_prach_burst.h"
#include "models/nr_prs.h"
#include "models/nr_rate_match_pattern.h"
#include "models/nr_resource_grid.h"
#include "models/nr_srs.h"
#include "models/nr_sspbch.h"
#include "models/nr_uci.h"
#include "models/nr_uci_on_pusch.h"
#include "models/nr_ul_bwp.h"
#include "models/nr_ulsch.h"
#include "models/nr_ulsch_rt.h"
#include "models/nr_uplink.h"
#include "models/nr_uplink_rt.h"
#include "models/payload_data.h"

namespace Models::Nr5g {

/// Registers all enumerations and model types with the framework, and TextModel; idempotent.
/// Each model header registers its own type at load already; this adds TextModel and keeps
/// one call that names them all.
bool registerModelTypes();

namespace detail {
inline const bool modelTypesRegistered = registerModelTypes();
}  // namespace detail

}  // namespace Models::Nr5g
