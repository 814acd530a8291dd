#pragma once
#include "keltext/host/members.h"

namespace kel {

// The class table of KelAlphaNumeric: how the catalogue creates it and reaches its members.
ClassInfo kel_alpha_numeric_class();

}  // namespace kel
