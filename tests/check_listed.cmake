# Fails when a *_test.cpp or a golden script under ROOT is missing from the lists in
# tests/CMakeLists.txt (LISTED, one path a line, relative to ROOT), or a listed one is gone.
file(GLOB_RECURSE present RELATIVE ${ROOT} ${ROOT}/*_test.cpp ${ROOT}/scripts/*.kfs)
file(STRINGS ${LISTED} listed)
list(FILTER listed INCLUDE REGEX "(_test\\.cpp|\\.kfs)$")
set(unlisted ${present})
list(REMOVE_ITEM unlisted ${listed})
set(missing ${listed})
list(REMOVE_ITEM missing ${present})
if(unlisted OR missing)
  message(FATAL_ERROR "tests/CMakeLists.txt is out of step with the folders.\n"
                      "Not listed (never built or run): ${unlisted}\nListed but not there: ${missing}")
endif()
