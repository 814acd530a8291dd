# Under Emscripten the find_package root is the Emscripten sysroot, which holds no
# nlohmann-json: the records' JSON library is header-only, so the build takes Debian's headers,
# through a folder of its own (never /usr/include as a whole, whose C library headers would
# stand before Emscripten's).
set(keltext_wasm_deps ${PROJECT_BINARY_DIR}/wasm-deps)
if(NOT EXISTS /usr/include/nlohmann/json.hpp)
  message(FATAL_ERROR "nlohmann-json3-dev is needed (tools/setup installs it)")
endif()
file(MAKE_DIRECTORY ${keltext_wasm_deps}/include)
file(CREATE_LINK /usr/include/nlohmann ${keltext_wasm_deps}/include/nlohmann SYMBOLIC)
file(WRITE ${keltext_wasm_deps}/nlohmann_json/nlohmann_jsonConfig.cmake
"if(NOT TARGET nlohmann_json::nlohmann_json)
  add_library(nlohmann_json::nlohmann_json INTERFACE IMPORTED)
  set_target_properties(nlohmann_json::nlohmann_json PROPERTIES
    INTERFACE_INCLUDE_DIRECTORIES ${keltext_wasm_deps}/include)
endif()
")
file(WRITE ${keltext_wasm_deps}/nlohmann_json/nlohmann_jsonConfigVersion.cmake
"set(PACKAGE_VERSION 3.11)
set(PACKAGE_VERSION_COMPATIBLE TRUE)
")
set(nlohmann_json_DIR ${keltext_wasm_deps}/nlohmann_json CACHE PATH "" FORCE)
