#pragma once
// Settings model NRRateMatchPattern.

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

class NRRateMatchPattern : public ModelBase {
    TESSALINE_MODEL_TYPE(NRRateMatchPattern)
  public:
    NRRateMatchPattern();
    std::string getRBBitmap() const { return RBBitmap->getValue(); }
    std::string getSymbolBitmap() const { return SymbolBitmap->getValue(); }
    std::string getPeriodicityPatternBitmap() const { return PeriodicityPatternBitmap->getValue(); }

    /// The item takes part in the generation.
    std::shared_ptr<BoolSetting> Enabled = std::make_shared<BoolSetting>("Enabled");
    /// Scope of the pattern.
    std::shared_ptr<EnumSetting<::Models::Nr5g::RateMatchPatternLevel>> Level =
        std::make_shared<EnumSetting<::Models::Nr5g::RateMatchPatternLevel>>("Level");
    /// Subcarrier spacing.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SubcarrierSpacing>> SubcarrierSpacing =
        std::make_shared<EnumSetting<::Models::Nr5g::SubcarrierSpacing>>("SubcarrierSpacing");
    /// Resource blocks covered, one character per block.
    std::shared_ptr<StringSetting> RBBitmap = std::make_shared<StringSetting>("RBBitmap");
    /// Span of `SymbolBitmap`.
    std::shared_ptr<EnumSetting<::Models::Nr5g::SymbolBitmapSpan>> SymbolBitmapSpan =
        std::make_shared<EnumSetting<::Models::Nr5g::SymbolBitmapSpan>>("SymbolBitmapSpan");
    /// Symbols covered, one character per symbol.
    std::shared_ptr<StringSetting> SymbolBitmap = std::make_shared<StringSetting>("SymbolBitmap");
    /// Period as a number of slots.
    std::shared_ptr<Int32Setting> Periodicity = std::make_shared<Int32Setting>("Periodicity");
    /// Slot pattern inside the period, one character per slot.
    std::shared_ptr<StringSetting> PeriodicityPatternBitmap =
        std::make_shared<StringSetting>("PeriodicityPatternBitmap");
};

TESSALINE_REGISTERED_MODEL(NRRateMatchPattern)

}  // namespace Models::Nr5g
