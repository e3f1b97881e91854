// A static-library user that includes one model header and nothing that names all models:
// the model type and the enumeration display names must be registered all the same.

#include <cstdio>
#include <memory>

#include "framework/json_serializer.h"
#include "models/nr_mib.h"

int main() {
    try {
        Orvalis::Tessaline::JsonSerializer reader;
        auto root = reader.deserialize(
            R"({"$type": "Models.Nr5g.NRMIB", "DmrstypeApos": 3, "CellBarred": "1: notBarred"})",
            "NRMIB");
        auto mib = std::dynamic_pointer_cast<Models::Nr5g::NRMIB>(root);
        if (!mib || mib->DmrstypeApos->getValue() != 3 ||
            mib->CellBarred->getValue() != Models::Nr5g::CellBarred::notBarred) {
            std::puts("NRMIB read back wrong");
            return 1;
        }
    } catch (const std::exception& e) {
        std::printf("%s\n", e.what());
        return 1;
    }
    std::puts("NRMIB registered by its own header");
    return 0;
}
