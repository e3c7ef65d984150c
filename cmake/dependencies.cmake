# Finds what dependencies.txt names, and gathers it in a target for each user: ingester_library_needs,
# ingester_command_needs, ingester_tests_needs.
set(INGESTER_DEPENDENCIES ${CMAKE_CURRENT_LIST_DIR}/dependencies.txt)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${INGESTER_DEPENDENCIES})

foreach(user library command tests)
    add_library(ingester_${user}_needs INTERFACE)
endforeach()

# A macro, since find_package leaves variables behind that its caller's folder needs.
macro(ingester_find_dependency found_as)
    if("${found_as}" MATCHES "^pkg:(.+)$")
        set(module ${CMAKE_MATCH_1})
        find_package(PkgConfig REQUIRED)
        pkg_check_modules(${module} REQUIRED IMPORTED_TARGET ${module})
    else()
        find_package(${found_as} REQUIRED)
    endif()
endmacro()

file(STRINGS ${INGESTER_DEPENDENCIES} rows REGEX "^[a-z0-9]")
foreach(row IN LISTS rows)
    separate_arguments(targets UNIX_COMMAND "${row}")
    list(POP_FRONT targets package found_as user)
    if(user STREQUAL "tests" AND NOT INGESTER_TESTS)
        continue()
    endif()
    ingester_find_dependency(${found_as})
    target_link_libraries(ingester_${user}_needs INTERFACE ${targets})
endforeach()
