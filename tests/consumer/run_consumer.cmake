# Installs the build tree into a scratch prefix, then builds and runs the consumer
# against it, once through find_package and once through pkg-config.
# Variables: BUILD_DIR, SOURCE_DIR, WORK_DIR, CXX_FLAGS and CXX_COMPILER (the flags and
# compiler the tree was built with, so that a sanitizer build links a sanitizer consumer
# of the same sanitizer runtime).
file(REMOVE_RECURSE ${WORK_DIR})
set(prefix ${WORK_DIR}/prefix)

function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE out)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "failed (${rc}): ${ARGN}\n${out}")
  endif()
  set(last_output "${out}" PARENT_SCOPE)
endfunction()

run(${CMAKE_COMMAND} --install ${BUILD_DIR} --prefix ${prefix})
run(${CMAKE_COMMAND} -S ${SOURCE_DIR} -B ${WORK_DIR}/build -DCMAKE_PREFIX_PATH=${prefix}
    "-DCMAKE_CXX_FLAGS=${CXX_FLAGS}" -DCMAKE_CXX_COMPILER=${CXX_COMPILER})
run(${CMAKE_COMMAND} --build ${WORK_DIR}/build)
run(${WORK_DIR}/build/consumer)
if(NOT last_output MATCHES "consumer ok")
  message(FATAL_ERROR "consumer printed: ${last_output}")
endif()

file(GLOB_RECURSE pc_files ${prefix}/*/qzscoring.pc)
list(GET pc_files 0 pc_file)
get_filename_component(pc_dir ${pc_file} DIRECTORY)
set(ENV{PKG_CONFIG_PATH} ${pc_dir})
run(pkg-config --cflags --libs qzscoring)
string(STRIP "${last_output}" flags)
separate_arguments(flags UNIX_COMMAND "${CXX_FLAGS} ${flags}")
run(${CXX_COMPILER} -std=c++17 ${SOURCE_DIR}/consumer.cpp -o ${WORK_DIR}/consumer_pc ${flags})
run(${WORK_DIR}/consumer_pc)
