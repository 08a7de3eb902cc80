# Writes the CTest tests of one test program, a suite each: see OrvaneTests.cmake.

execute_process(COMMAND ${PROGRAM} --gtest_list_tests OUTPUT_VARIABLE listing
                RESULT_VARIABLE result)
if(NOT result EQUAL 0)
    message(FATAL_ERROR "${PROGRAM} cannot list its tests: ${result}")
endif()

string(REGEX MATCHALL "(^|\n)[A-Za-z0-9_/]+\\." suites "${listing}")
set(content "")
foreach(suite IN LISTS suites)
    string(REGEX REPLACE "[\n.]" "" suite "${suite}")
    string(APPEND content "add_test([==[${NAME}.${suite}]==] \"${PROGRAM}\""
                          " [==[--gtest_filter=${suite}.*]==] --gtest_brief=1)\n"
                          "set_tests_properties([==[${NAME}.${suite}]==] PROPERTIES"
                          " LABELS \"${LABEL}\" SKIP_RETURN_CODE 77)\n")
endforeach()
file(WRITE ${OUTPUT} "${content}")
