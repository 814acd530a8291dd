# The `wasm` preset's toolchain: Debian's Emscripten (emcmake's own toolchain file), with C++
# exceptions as WebAssembly exceptions (the script player reports a script error by throwing;
# Emscripten's default would abort instead, and its JavaScript-emulated exceptions cost twice as
# much a keystroke).
#
# Emscripten builds missing system libraries into its cache on first use; the system's cache
# (/usr/share/emscripten/cache) is shared and not ours to write, so the preset points EM_CACHE
# into the build tree and this file fills it with a copy of the system's cache, once.
set(KELTEXT_EMSCRIPTEN_ROOT "/usr/share/emscripten" CACHE PATH "Emscripten's installation (Debian's package)")
if(DEFINED ENV{EM_CACHE} AND NOT EXISTS "$ENV{EM_CACHE}/sysroot_install.stamp")
  message(STATUS "Copying Emscripten's cache to $ENV{EM_CACHE}")
  file(MAKE_DIRECTORY "$ENV{EM_CACHE}")
  # Only the static libraries and headers this build links; the LTO and PIC variants are large.
  execute_process(
    COMMAND tar -C "${KELTEXT_EMSCRIPTEN_ROOT}/cache" --exclude=./sysroot/lib/wasm32-emscripten/lto
            --exclude=./sysroot/lib/wasm32-emscripten/lto-pic --exclude=./sysroot/lib/wasm32-emscripten/pic
            --exclude=./cache.lock -cf - .
    COMMAND tar -C "$ENV{EM_CACHE}" -xf -
    RESULT_VARIABLE copied)
  if(NOT copied EQUAL 0)
    message(FATAL_ERROR "could not copy ${KELTEXT_EMSCRIPTEN_ROOT}/cache to $ENV{EM_CACHE} (tools/setup --web installs Emscripten)")
  endif()
endif()
include("${KELTEXT_EMSCRIPTEN_ROOT}/cmake/Modules/Platform/Emscripten.cmake")
set(CMAKE_CXX_FLAGS_INIT "-fwasm-exceptions")
set(CMAKE_EXE_LINKER_FLAGS_INIT "-fwasm-exceptions -sALLOW_MEMORY_GROWTH=1")
