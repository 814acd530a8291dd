# One place for the compiler flags every KelText target gets. Build-tree only: it carries
# -Werror, which must never reach an embedder's build, so it is neither installed nor exported.
add_library(keltext_flags INTERFACE)
target_compile_options(keltext_flags INTERFACE
  $<$<CXX_COMPILER_ID:GNU,Clang>:-Wall -Wextra -Wpedantic>
  $<$<AND:$<CXX_COMPILER_ID:GNU,Clang>,$<BOOL:${KELTEXT_WERROR}>>:-Werror>)
if(KELTEXT_SANITIZE)
  target_compile_options(keltext_flags INTERFACE -fsanitize=address,undefined -fno-omit-frame-pointer -fno-sanitize-recover=undefined)
  target_link_options(keltext_flags INTERFACE -fsanitize=address,undefined)
endif()
