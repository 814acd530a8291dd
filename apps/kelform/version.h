#pragma once
#include <string_view>

namespace kel::kelform {

std::string_view version();

}  // namespace kel::kelform
