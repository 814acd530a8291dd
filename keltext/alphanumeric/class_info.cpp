#include "keltext/alphanumeric/class_info.h"

namespace kel {

// Placeholder until the control lands: known by name, not yet creatable.
ClassInfo kel_alpha_numeric_class() { ClassInfo c; c.name = "KelAlphaNumeric"; return c; }

}  // namespace kel
