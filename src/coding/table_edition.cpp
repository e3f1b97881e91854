#include "coding/table_edition.h"

namespace Orvalis_NR {

int specVersion = 152;

}  // namespace Orvalis_NR
