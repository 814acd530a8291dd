#include "apps/kelform/version.h"

namespace kel::kelform {

std::string_view version() { return KELTEXT_VERSION; }

}  // namespace kel::kelform
