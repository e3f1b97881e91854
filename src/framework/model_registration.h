#pragma once
// Registration of a model type beside the model itself. The model's header declares a
// registration function and calls it from an inline variable, so every program that includes
// the header registers the type at load; the call also makes the linker keep the model's
// object file, which a static library would otherwise leave out when nothing else refers to it.

#include <memory>

#include "model_container.h"
#include "prototype.h"
#include "runtime_type.h"

namespace Orvalis::Tessaline {

/// Adds `T` to the process-wide registry; a second call keeps the one entry.
template <class T>
bool registerModelType() {
    Prototype::getInstance<ModelContainer>()->add(Prototype::getInstance<T>(),
                                                  Prototype::getInstance<RuntimeType<T>>());
    return true;
}

}  // namespace Orvalis::Tessaline

/// In a model's header, after the class: registers the type at load in every includer.
#define TESSALINE_REGISTERED_MODEL(ClassName)                                   \
    bool registerModelType_##ClassName();                                       \
    namespace detail {                                                          \
    inline const bool registered_##ClassName = registerModelType_##ClassName(); \
    }

/// In the model's source file: the registration function the header calls.
#define TESSALINE_MODEL_REGISTRATION(ClassName)                                        \
    bool registerModelType_##ClassName() {                                             \
        static const bool done = ::Orvalis::Tessaline::registerModelType<ClassName>(); \
        return done;                                                                   \
    }
