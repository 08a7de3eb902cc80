# orvane_test(NAME LABEL SOURCES...)
#
# A GoogleTest program of which every suite is one CTest test with the given label. A process per
# suite keeps suites apart without paying a process start for each case.

find_package(GTest REQUIRED)

function(orvane_test name label)
    add_executable(${name} ${ARGN})
    target_link_libraries(${name} PRIVATE orvane_options orvane_support orvane_static
                                          GTest::gtest GTest::gmock)
    target_include_directories(${name} PRIVATE ${PROJECT_SOURCE_DIR}/Tests)
    target_precompile_headers(${name} PRIVATE <gtest/gtest.h> <functional> <map> <memory> <string>
                              <vector>)
    set(list ${CMAKE_CURRENT_BINARY_DIR}/${name}_suites.cmake)
    add_custom_command(TARGET ${name} POST_BUILD BYPRODUCTS ${list}
        COMMAND ${CMAKE_COMMAND} -DPROGRAM=$<TARGET_FILE:${name}> -DNAME=${name} -DLABEL=${label}
                -DOUTPUT=${list} -P ${PROJECT_SOURCE_DIR}/Tools/cmake/ListSuites.cmake
        VERBATIM)
    set_property(DIRECTORY APPEND PROPERTY TEST_INCLUDE_FILES ${list})
endfunction()
