# Script mode: install BUILD_DIR into a new prefix under WORK_DIR, then build and run the consumer
# project in PROJECT_DIR against it. Any failing step fails the test.
file(REMOVE_RECURSE ${WORK_DIR})
set(prefix ${WORK_DIR}/prefix)

function(run_step)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "step failed (${rc}): ${ARGN}\n${out}\n${err}")
  endif()
  set(STEP_OUTPUT "${out}" PARENT_SCOPE)
endfunction()

run_step(${CMAKE_COMMAND} --install ${BUILD_DIR} --prefix ${prefix})
# The installed zrender starts from the prefix with no environment set: it finds the library
# through its own run path.
if(EXISTS ${prefix}/bin/zrender)
  run_step(${CMAKE_COMMAND} -E env --unset=LD_LIBRARY_PATH ${prefix}/bin/zrender --size 32x24 -o ${WORK_DIR}/installed.png)
  if(NOT EXISTS ${WORK_DIR}/installed.png)
    message(FATAL_ERROR "the installed zrender wrote no picture")
  endif()
endif()
run_step(${CMAKE_COMMAND} -S ${PROJECT_DIR} -B ${WORK_DIR}/build -G ${GENERATOR}
         -DCMAKE_PREFIX_PATH=${prefix} "-DCMAKE_CXX_FLAGS=${CXX_FLAGS}"
         "-DCMAKE_EXE_LINKER_FLAGS=${LINKER_FLAGS}")
run_step(${CMAKE_COMMAND} --build ${WORK_DIR}/build)
run_step(${WORK_DIR}/build/consumer)
message(STATUS "${STEP_OUTPUT}")
if(NOT STEP_OUTPUT MATCHES "consumer ok")
  message(FATAL_ERROR "the consumer did not report success:\n${STEP_OUTPUT}")
endif()
