#include "models/payload_data.h"

namespace Models::Nr5g {

PayloadData::PayloadData() : ModelBase("PayloadData") {
    init(PayLoadDataType)->setValue(::Models::Nr5g::PayloadDataType::PN9);
    init(Fix4)->setValue(0);
    init(PatternBits)->setValue(std::string{});
    init(UserFile)->setValue(std::string{});
}

TESSALINE_MODEL_REGISTRATION(PayloadData)

}  // namespace Models::Nr5g
