cmake_minimum_required(VERSION 3.16)

# Installs the build tree into a scratch prefix, then configures, builds and
# runs the small consumer project against it through find_package.
set(prefix ${WORK_DIR}/prefix)
set(consumer_build ${WORK_DIR}/build)
file(REMOVE_RECURSE ${WORK_DIR})

function(run)
    execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc)
    if(NOT rc EQUAL 0)
        list(JOIN ARGN " " text)
        message(FATAL_ERROR "failed (${rc}): ${text}")
    endif()
endfunction()

set(config_args "")
if(CONFIG)
    set(config_args --config ${CONFIG})
endif()
run(${CMAKE_COMMAND} --install ${BUILD_DIR} --prefix ${prefix} ${config_args})

# kestaccel_DIR is given as well as the prefix: a cross toolchain confines
# package searches to its own root.
set(configure_args -S ${CONSUMER_SOURCE} -B ${consumer_build} -G ${GENERATOR}
    -DCMAKE_PREFIX_PATH=${prefix} -Dkestaccel_DIR=${prefix}/lib/cmake/kestaccel -DCMAKE_BUILD_TYPE=Release)
if(TOOLCHAIN)
    list(APPEND configure_args -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN})
endif()
run(${CMAKE_COMMAND} ${configure_args})
run(${CMAKE_COMMAND} --build ${consumer_build} ${config_args})

# The consumer finds the shared libraries through its RPATH on ELF systems;
# on Windows the DLLs are copied beside it by the consumer's own build.
file(GLOB_RECURSE consumer_exe ${consumer_build}/consumer ${consumer_build}/consumer.exe)
if(NOT consumer_exe)
    message(FATAL_ERROR "the consumer executable was not built")
endif()
list(GET consumer_exe 0 exe)
if(EMULATOR)
    run(${EMULATOR} ${exe})
else()
    run(${exe})
endif()
