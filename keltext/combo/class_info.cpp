#include "keltext/combo/class_info.h"

namespace kel {

// Placeholder until the control lands: known by name, not yet creatable.
ClassInfo kel_combo_class() { ClassInfo c; c.name = "KelCombo"; return c; }
ClassInfo pag_combo_class() { ClassInfo c; c.name = "pagCombo"; c.is_page = true; return c; }

}  // namespace kel
