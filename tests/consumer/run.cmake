cmake_policy(VERSION 3.16)
# A host outside the tree: configured, built and run against this build tree, then against an
# install into a scratch prefix, each time without LD_LIBRARY_PATH. The install must hold the
# public headers flat and nothing internal.
file(REMOVE_RECURSE ${WORK_DIR})
file(MAKE_DIRECTORY ${WORK_DIR})
set(prefix ${WORK_DIR}/prefix)
unset(ENV{LD_LIBRARY_PATH})
set(ENV{QT_QPA_PLATFORM} offscreen)

function(run_step)
    execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
    if(NOT rc EQUAL 0)
        message(FATAL_ERROR "step failed (${rc}): ${ARGN}\n${out}\n${err}")
    endif()
    set(last_output "${out}" PARENT_SCOPE)
endfunction()

function(build_and_run label prefix_path)
    set(build ${WORK_DIR}/build-${label})
    run_step(${CMAKE_COMMAND} -S ${CONSUMER_DIR} -B ${build}
        -DCMAKE_PREFIX_PATH=${prefix_path} -DCMAKE_BUILD_TYPE=Release)
    run_step(${CMAKE_COMMAND} --build ${build})
    run_step(${build}/consumer)
    if(NOT last_output MATCHES "application ok, [1-9][0-9]* display\\(s\\)")
        message(FATAL_ERROR "${label}: unexpected consumer output: ${last_output}")
    endif()
    message(STATUS "${label}: ${last_output}")
endfunction()

build_and_run(buildtree ${BUILD_DIR})

run_step(${CMAKE_COMMAND} --install ${BUILD_DIR} --prefix ${prefix})
file(GLOB installed RELATIVE ${prefix}/include/zubase ${prefix}/include/zubase/*)
foreach(name IN LISTS installed)
    if(name MATCHES "_p\\.h$|^Sys|^platform$|^ReparseBuffer|^HandleTable|^ZuCheck_p\\.h$")
        message(FATAL_ERROR "internal header installed: ${name}")
    endif()
endforeach()
if(NOT "ZuApplication.h" IN_LIST installed OR NOT "zubase_export.h" IN_LIST installed)
    message(FATAL_ERROR "public headers missing from the install: ${installed}")
endif()
build_and_run(install ${prefix})
