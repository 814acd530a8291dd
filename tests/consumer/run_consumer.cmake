# Installs KelText into a scratch prefix, then configures, builds and runs a small application
# that finds it with find_package(KelText).
file(REMOVE_RECURSE ${WORK})
set(build ${WORK}/keltext-build)
set(prefix ${WORK}/prefix)
function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "failed: ${ARGN}\n${out}\n${err}")
  endif()
endfunction()
run(${CMAKE_COMMAND} -S ${SOURCE} -B ${build} -G ${GENERATOR} -DCMAKE_CXX_COMPILER=${CXX}
    -DCMAKE_BUILD_TYPE=Release -DKELTEXT_BUILD_TESTS=OFF -DKELTEXT_BUILD_APPS=OFF -DKELTEXT_BUILD_BENCH=OFF
    -DCMAKE_INSTALL_PREFIX=${prefix})
run(${CMAKE_COMMAND} --build ${build} --parallel 2)
run(${CMAKE_COMMAND} --install ${build})
run(${CMAKE_COMMAND} -S ${SOURCE}/tests/consumer -B ${WORK}/app -G ${GENERATOR} -DCMAKE_CXX_COMPILER=${CXX}
    -DCMAKE_PREFIX_PATH=${prefix})
run(${CMAKE_COMMAND} --build ${WORK}/app)
run(${WORK}/app/consumer)
