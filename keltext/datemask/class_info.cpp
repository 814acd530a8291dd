#include "keltext/datemask/class_info.h"

namespace kel {

// Placeholder until the control lands: known by name, not yet creatable.
ClassInfo kel_date_mask_class() { ClassInfo c; c.name = "KelDateMask"; return c; }

}  // namespace kel
