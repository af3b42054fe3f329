# cmake -P script: install BUILD_DIR into WORK_DIR/prefix, then build and run the consumer (through
# EMULATOR when the build's programs need one).
file(REMOVE_RECURSE ${WORK_DIR})
set(prefix ${WORK_DIR}/prefix)
function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "failed (${rc}): ${ARGN}\n${out}\n${err}")
  endif()
endfunction()
run(${CMAKE_COMMAND} --install ${BUILD_DIR} --prefix ${prefix})
run(${CMAKE_COMMAND} -S ${SOURCE_DIR} -B ${WORK_DIR}/build -DCMAKE_PREFIX_PATH=${prefix}
    -DCMAKE_CXX_COMPILER=${CXX} "-DCMAKE_CXX_FLAGS=${CXX_FLAGS}" "-DCMAKE_EXE_LINKER_FLAGS=${LINKER_FLAGS}")
run(${CMAKE_COMMAND} --build ${WORK_DIR}/build)
run(${EMULATOR} ${WORK_DIR}/build/consumer)
# pkg-config route: compile the same source by hand with the flags the .pc file gives.
file(GLOB_RECURSE pcfile ${prefix}/*/tarnstats.pc)
file(STRINGS ${pcfile} cflags REGEX "^Cflags:")
file(STRINGS ${pcfile} libs REGEX "^Libs:")
get_filename_component(libdir ${pcfile} DIRECTORY)
get_filename_component(libdir ${libdir} DIRECTORY)
separate_arguments(flags UNIX_COMMAND "${CXX_FLAGS} ${LINKER_FLAGS}")
run(${CXX} -std=c++17 ${flags} -I${prefix}/include ${SOURCE_DIR}/consumer.cpp -L${libdir} -ltarnstats -lplinth -ltarnctl
    -Wl,-rpath,${libdir} -o ${WORK_DIR}/consumer-pc)
run(${EMULATOR} ${WORK_DIR}/consumer-pc)
if(NOT cflags MATCHES "-I" OR NOT libs MATCHES "-ltarnstats")
  message(FATAL_ERROR "pkg-config file lacks flags: ${cflags} ${libs}")
endif()
