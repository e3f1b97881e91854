#include "interface/calculator.h"

#include "framework/prototype.h"

namespace Orvalis_NR {

int Calculator::add(int a, int b) { return a + b; }

void Calculator::test() {}

std::shared_ptr<Orvalis::Tessaline::ModelContainer> Calculator::getModelContainer() {
    return Orvalis::Tessaline::Prototype::getInstance<Orvalis::Tessaline::ModelContainer>();
}

}  // namespace Orvalis_NR
