# What the rows of CMakeLists.txt make.
add_custom_target(fuzz_readers)

function(fuzz_objects name)
    add_library(fuzz_${name} OBJECT ${ARGN})
    target_include_directories(fuzz_${name} PRIVATE ${CMAKE_CURRENT_SOURCE_DIR} ${PROJECT_SOURCE_DIR}/tests)
    target_link_libraries(fuzz_${name} PRIVATE ingester_core ingester_flags)
endfunction()

# Compiled once for all targets.
fuzz_objects(checks ${PROJECT_SOURCE_DIR}/tests/support/check_sheet.cpp)
fuzz_objects(reader_main reader_main.cpp)
fuzz_objects(function_main function_main.cpp)

function(fuzz_target name main)
    add_executable(fuzz_${name} ${ARGN})
    target_include_directories(fuzz_${name} PRIVATE ${CMAKE_CURRENT_SOURCE_DIR} ${PROJECT_SOURCE_DIR}/tests)
    target_link_libraries(fuzz_${name} PRIVATE fuzz_${main} fuzz_checks ingester_core ingester_flags -fsanitize=fuzzer)
    add_dependencies(fuzz_readers fuzz_${name})
endfunction()

function(fuzz_reader name header entry)
    set(prepare ${ARGN} ${name})
    list(GET prepare 0 prepare)
    if(NOT ARGN AND NOT EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/prepare/${name}.cpp)
        set(prepare nothing)
    endif()
    fuzz_target(${name} reader_main reader_entry.cpp prepare/${prepare}.cpp)
    target_compile_definitions(fuzz_${name} PRIVATE FUZZ_HEADER="${header}" FUZZ_ENTRY=${entry})
endfunction()

function(fuzz_function name)
    fuzz_target(${name} function_main try/${name}.cpp)
endfunction()
