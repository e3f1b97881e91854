#pragma once
// A small exported class through which a host reaches the registry of model types.

#include <memory>

#include "framework/model_container.h"

namespace Orvalis_NR {

class Calculator {
public:
    int add(int a, int b);
    void test();
    /// The process-wide registry of model types.
    std::shared_ptr<Orvalis::Tessaline::ModelContainer> getModelContainer();
};

}  // namespace Orvalis_NR
