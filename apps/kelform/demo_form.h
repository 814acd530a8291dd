#pragma once
// The built-in demo form: the text of examples/voucher.kform, compiled into the program at
// build time (demo_form.cmake), so that `kelform` runs the very form that examples/ ships.
#include <string_view>

namespace kel::kelform {

std::string_view demo_form_text();
// The name error messages give the built-in form.
inline constexpr std::string_view kDemoFormName = "voucher.kform";

}  // namespace kel::kelform
