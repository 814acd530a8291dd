#pragma once
#include "keltext/host/members.h"

namespace kel {

// The class table of KelCombo: how the catalogue creates it and reaches its members.
ClassInfo kel_combo_class();
// The property page of KelCombo.
ClassInfo pag_combo_class();

}  // namespace kel
