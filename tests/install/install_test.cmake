# One step of the tests of an installed copy; run by cmake -P with the variables of CMakeLists.txt here.
cmake_minimum_required(VERSION 3.22)

set(prefix ${SCRATCH}/prefix)
set(library ${prefix}/${LIBRARIES}/libingester.so)
set(work ${SCRATCH}/${STEP})

function(run)
    execute_process(COMMAND ${ARGN} WORKING_DIRECTORY ${work} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

# The consumers' requests find no pass file: they are done when the library was found and answered.
function(run_consumer program)
    run(${CMAKE_COMMAND} -E env TMPDIR=${work} LD_LIBRARY_PATH=${prefix}/${LIBRARIES} ${program})
endfunction()

function(test_prefix)
    run(${CMAKE_COMMAND} --install ${BUILD} --prefix ${prefix})
    foreach(file ${library} ${prefix}/bin/ingester ${prefix}/include/ingester/ingester.h)
        if(NOT EXISTS ${file})
            message(FATAL_ERROR "not installed: ${file}")
        endif()
    endforeach()
endfunction()

function(test_exports)
    file(READ ${EXPORTS} map)
    string(REGEX REPLACE ".*global:([^:]*)local:.*" "\\1" map "${map}")
    string(REGEX MATCHALL "[A-Za-z_][A-Za-z_0-9]*" wanted "${map}")
    list(SORT wanted)
    execute_process(COMMAND ${NM} -D --defined-only ${library} OUTPUT_VARIABLE symbols
                    COMMAND_ERROR_IS_FATAL ANY)
    string(REGEX REPLACE "[0-9a-f]+ [A-Za-z] ([^\n]*)\n" "\\1;" found "${symbols}")
    list(REMOVE_ITEM found "")
    list(SORT found)
    if(NOT "${found}" STREQUAL "${wanted}")
        message(FATAL_ERROR "the library shows '${found}', its list of exports is '${wanted}'")
    endif()
    execute_process(COMMAND ${READELF} -d ${library} OUTPUT_VARIABLE facts COMMAND_ERROR_IS_FATAL ANY)
    if(NOT facts MATCHES "soname: \\[libingester\\.so\\.1\\]")
        message(FATAL_ERROR "the library's soname is not libingester.so.1:\n${facts}")
    endif()
endfunction()

function(test_cmake_package)
    run(${CMAKE_COMMAND} -G ${GENERATOR} -S ${SOURCE}/consumer -B ${work}/build -DCMAKE_PREFIX_PATH=${prefix}
        -DCMAKE_C_COMPILER=${CC} -DCMAKE_CXX_COMPILER=${CXX})
    run(${CMAKE_COMMAND} --build ${work}/build)
    run_consumer(${work}/build/c_consumer)
    run_consumer(${work}/build/cpp_consumer)
endfunction()

function(test_pkg_config)
    set(ENV{PKG_CONFIG_PATH} ${prefix}/${LIBRARIES}/pkgconfig)
    execute_process(COMMAND pkg-config --cflags --libs ingester OUTPUT_VARIABLE flags
                    OUTPUT_STRIP_TRAILING_WHITESPACE COMMAND_ERROR_IS_FATAL ANY)
    separate_arguments(flags UNIX_COMMAND "${flags}")
    run(${CC} -std=c99 -Wall -Wextra -pedantic-errors -Werror ${SOURCE}/consumer/consumer.c ${flags} -o c_consumer)
    run(${CXX} -Wall -Wextra -pedantic-errors -Werror ${SOURCE}/consumer/consumer.cpp ${flags} -o cpp_consumer)
    run_consumer(${work}/c_consumer)
    run_consumer(${work}/cpp_consumer)
endfunction()

function(test_dlopen_host)
    run(${CMAKE_COMMAND} -E env TMPDIR=${work} ${DLOPEN_HOST} ${library})
endfunction()

if(STEP STREQUAL prefix)
    file(REMOVE_RECURSE ${SCRATCH})
endif()
file(REMOVE_RECURSE ${work})
file(MAKE_DIRECTORY ${work})
cmake_language(CALL test_${STEP})
