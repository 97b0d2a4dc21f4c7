# SPDX-License-Identifier: MIT
# vclink_add_tests(TARGET LABEL label SOURCES file... [LIBRARIES library...]): an executable of
# GoogleTest cases, each a test of ctest. It links the layers' objects, so that what the library
# hides can be tested too.
#
# vclink_thread_tests builds the executables whose tests are labelled "threads" and nothing else, for
# the builds under ThreadSanitizer.
add_custom_target(vclink_thread_tests)

function(vclink_add_tests target)
    cmake_parse_arguments(PARSE_ARGV 1 arg "" "LABEL" "SOURCES;LIBRARIES")
    if(NOT arg_LABEL OR arg_UNPARSED_ARGUMENTS)
        message(FATAL_ERROR "${target}: one label, not '${arg_LABEL};${arg_UNPARSED_ARGUMENTS}'")
    endif()
    add_executable(${target}
        ${arg_SOURCES}
        ${PROJECT_SOURCE_DIR}/tests/support/leakSuppressions.cpp
        ${PROJECT_SOURCE_DIR}/tests/support/raceSuppressions.cpp)
    vclink_configure_target(${target})
    target_link_libraries(${target} PRIVATE
        vclink_git_objects vclink_test_support ${arg_LIBRARIES} GTest::gmock GTest::gtest_main)
    if(VCLINK_RECORD_REACH)
        target_sources(${target} PRIVATE ${PROJECT_SOURCE_DIR}/tests/support/ReachRecorder.cpp)
        target_link_libraries(${target} PRIVATE ${CMAKE_DL_LIBS})
    endif()
    if(arg_LABEL STREQUAL "threads")
        add_dependencies(vclink_thread_tests ${target})
    endif()
    gtest_discover_tests(${target}
        DISCOVERY_TIMEOUT 60
        PROPERTIES LABELS ${arg_LABEL} TIMEOUT 300)
endfunction()
