#include "keltext/numeric/class_info.h"

namespace kel {

// Placeholder until the control lands: known by name, not yet creatable.
ClassInfo kel_numeric_class() { ClassInfo c; c.name = "KelNumeric"; return c; }

}  // namespace kel
