# Writes OUT, a C++ source that returns the text of IN (the demo form file) as a raw string.
file(READ "${IN}" text)
string(FIND "${text}" ")kform\"" clash)
if(NOT clash EQUAL -1)
  message(FATAL_ERROR "${IN} contains the raw-string delimiter )kform\"")
endif()
file(WRITE "${OUT}.tmp"
"// Generated from ${IN} by demo_form.cmake. Do not edit.\n"
"#include \"apps/kelform/demo_form.h\"\n\n"
"namespace kel::kelform {\n\n"
"std::string_view demo_form_text() {\n"
"    static constexpr std::string_view text = R\"kform(${text})kform\";\n"
"    return text;\n"
"}\n\n"
"}  // namespace kel::kelform\n")
file(COPY_FILE "${OUT}.tmp" "${OUT}" ONLY_IF_DIFFERENT)
file(REMOVE "${OUT}.tmp")
