# Builds and runs the consumer project in one of two ways (run with cmake -P):
#   MODE=subdirectory  the consumer adds the library's source tree with add_subdirectory
#   MODE=find_package  the library's build tree is installed into a fresh prefix and the
#                      consumer finds it with find_package(OrzaVSMobile)
# Inputs: MODE, SOURCE_DIR (library sources), BINARY_DIR (library build tree), WORK_DIR,
# GENERATOR, C_COMPILER, CXX_COMPILER.
foreach(var MODE SOURCE_DIR BINARY_DIR WORK_DIR GENERATOR CXX_COMPILER)
  if(NOT DEFINED ${var} OR "${${var}}" STREQUAL "")
    message(FATAL_ERROR "RunPackageTest: ${var} is not set")
  endif()
endforeach()

function(run_step what)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "${what} failed (${rc}):\n${out}\n${err}")
  endif()
  set(step_output "${out}" PARENT_SCOPE)
endfunction()

file(REMOVE_RECURSE "${WORK_DIR}")
file(MAKE_DIRECTORY "${WORK_DIR}")
set(consumer_build "${WORK_DIR}/consumer-build")
set(configure_args -S "${SOURCE_DIR}/tests/package/consumer" -B "${consumer_build}"
    -G "${GENERATOR}" -DCMAKE_BUILD_TYPE=Debug "-DCMAKE_CXX_COMPILER=${CXX_COMPILER}")
if(C_COMPILER)
  list(APPEND configure_args "-DCMAKE_C_COMPILER=${C_COMPILER}")
endif()

if(MODE STREQUAL "subdirectory")
  list(APPEND configure_args -DORZAVS_CONSUMER_MODE=subdirectory "-DORZAVS_SOURCE_DIR=${SOURCE_DIR}")
elseif(MODE STREQUAL "find_package")
  set(prefix "${WORK_DIR}/prefix")
  run_step("install into ${prefix}" ${CMAKE_COMMAND} --install "${BINARY_DIR}" --prefix "${prefix}")
  if(NOT EXISTS "${prefix}/include/OrzaVSMobile/OrzaVSMobile.h")
    message(FATAL_ERROR "the install did not place OrzaVSMobile.h under include/OrzaVSMobile")
  endif()
  list(APPEND configure_args -DORZAVS_CONSUMER_MODE=find_package "-DCMAKE_PREFIX_PATH=${prefix}")
else()
  message(FATAL_ERROR "RunPackageTest: unknown MODE '${MODE}'")
endif()

run_step("configure the consumer" ${CMAKE_COMMAND} ${configure_args})
run_step("build the consumer" ${CMAKE_COMMAND} --build "${consumer_build}" --target consumer -j 2)
run_step("run the consumer" "${consumer_build}/consumer")
if(NOT step_output MATCHES "camera 320-720, filled 64, module VISUAL_SEARCH_SERVICE_MOD")
  message(FATAL_ERROR "unexpected consumer output: ${step_output}")
endif()
message(STATUS "consumer (${MODE}): ${step_output}")
file(REMOVE_RECURSE "${WORK_DIR}")
