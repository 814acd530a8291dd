#pragma once
#include "keltext/host/members.h"

namespace kel {

// The class table of KelDateMask: how the catalogue creates it and reaches its members.
ClassInfo kel_date_mask_class();

}  // namespace kel
