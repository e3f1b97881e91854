#pragma once
// Settings model NRCORESET.

#include <memory>
#include <string>

#include "framework/enum_setting.h"
#include "framework/model_base.h"
#include "framework/model_registration.h"
#include "framework/sub_setting.h"
#include "framework/value_setting.h"
#include "models/enums.h"

namespace Models::Nr5g {

using Orvalis::Tessaline::BoolSetting;
using Orvalis::Tessaline::DoubleSetting;
using Orvalis::Tessaline::EnumSetting;
using Orvalis::Tessaline::Int32Setting;
using Orvalis::Tessaline::ModelBase;
using Orvalis::Tessaline::ModelCollection;
using Orvalis::Tessaline::StringSetting;
using Orvalis::Tessaline::SubSetting;

class NRCORESET : public ModelBase {
    TESSALINE_MODEL_TYPE(NRCORESET)
  public:
    NRCORESET();

    /// Identifier.
    std::shared_ptr<Int32Setting> ID = std::make_shared<Int32Setting>("ID");
    /// Number of OFDM symbols.
    std::shared_ptr<Int32Setting> SymbolNumber = std::make_shared<Int32Setting>("SymbolNumber");
    /// First resource block, relative to the bandwidth part.
    std::shared_ptr<Int32Setting> RBOffset = std::make_shared<Int32Setting>("RBOffset");
    /// Number of resource blocks.
    std::shared_ptr<Int32Setting> RBNumber = std::make_shared<Int32Setting>("RBNumber");
    /// Frequency-domain resources, as a string of "0" and "1".
    std::shared_ptr<StringSetting> FrequencyDomainBitmap =
        std::make_shared<StringSetting>("FrequencyDomainBitmap");
    /// CCE-to-REG mapping.
    std::shared_ptr<EnumSetting<::Models::Nr5g::CoresetCceMappingType>> CceMappingType =
        std::make_shared<EnumSetting<::Models::Nr5g::CoresetCceMappingType>>("CceMappingType");
    /// Interleaving is on.
    std::shared_ptr<BoolSetting> CceInterleaved = std::make_shared<BoolSetting>("CceInterleaved");
    /// REG bundle size.
    std::shared_ptr<Int32Setting> RegBundleSize = std::make_shared<Int32Setting>("RegBundleSize");
    /// Interleaver size.
    std::shared_ptr<Int32Setting> InterleaverSize =
        std::make_shared<Int32Setting>("InterleaverSize");
    /// Shift index.
    std::shared_ptr<Int32Setting> ShiftIndex = std::make_shared<Int32Setting>("ShiftIndex");
    /// Precoder granularity.
    std::shared_ptr<EnumSetting<::Models::Nr5g::PrecoderGranularity>> PrecoderGranularity =
        std::make_shared<EnumSetting<::Models::Nr5g::PrecoderGranularity>>("PrecoderGranularity");
    /// Scrambling identity of the PDCCH DM-RS; -1 means the cell identity.
    std::shared_ptr<Int32Setting> PDCCHDMRSScramblingID =
        std::make_shared<Int32Setting>("PDCCHDMRSScramblingID");
};

TESSALINE_REGISTERED_MODEL(NRCORESET)

}  // namespace Models::Nr5g
