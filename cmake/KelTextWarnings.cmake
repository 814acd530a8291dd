# One place for the compiler flags every KelText target gets.
add_library(keltext_flags INTERFACE)
target_compile_options(keltext_flags INTERFACE
  $<$<CXX_COMPILER_ID:GNU,Clang>:-Wall -Wextra -Wpedantic>
  $<$<AND:$<CXX_COMPILER_ID:GNU,Clang>,$<BOOL:${KELTEXT_WERROR}>>:-Werror>)
if(KELTEXT_SANITIZE)
  target_compile_options(keltext_flags INTERFACE -fsanitize=address,undefined -fno-omit-frame-pointer -fno-sanitize-recover=undefined)
  target_link_options(keltext_flags INTERFACE -fsanitize=address,undefined)
endif()

# Adds a library target of one layer: every .cpp in DIR, include root at the repository root.
function(keltext_layer name dir)
  file(GLOB sources CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.cpp)
  file(GLOB headers CONFIGURE_DEPENDS ${CMAKE_CURRENT_SOURCE_DIR}/${dir}/*.h)
  add_library(${name} STATIC ${sources} ${headers})
  add_library(keltext::${name} ALIAS ${name})
  string(REPLACE "keltext_" "" export_name ${name})
  set_target_properties(${name} PROPERTIES EXPORT_NAME ${export_name} POSITION_INDEPENDENT_CODE ON)
  target_include_directories(${name} PUBLIC
    $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>
    $<INSTALL_INTERFACE:include>)
  target_link_libraries(${name} PRIVATE $<BUILD_INTERFACE:keltext_flags>)
  install(FILES ${headers} DESTINATION include/keltext/${dir})
endfunction()
