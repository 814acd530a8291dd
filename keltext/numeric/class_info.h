#pragma once
#include "keltext/host/members.h"

namespace kel {

// The class table of KelNumeric: how the catalogue creates it and reaches its members.
ClassInfo kel_numeric_class();

}  // namespace kel
