# SPDX-License-Identifier: MIT
# What every compiled target of this repository has in common.
function(vclink_configure_target target)
    target_compile_features(${target} PUBLIC cxx_std_17)
    set_target_properties(${target} PROPERTIES
        CXX_EXTENSIONS OFF
        CXX_VISIBILITY_PRESET hidden
        C_VISIBILITY_PRESET hidden
        VISIBILITY_INLINES_HIDDEN ON
        POSITION_INDEPENDENT_CODE ON)
    target_link_libraries(${target} PRIVATE
        $<BUILD_INTERFACE:vclink_warnings> $<BUILD_INTERFACE:vclink_instrumentation>)
endfunction()

# vclink_configure_test_target(TARGET): for tests and what helps them. VCLINK_TEST_OPTIONS follow the
# options of everything else, so that a preset can spare tests an instrumentation or optimisation
# that the library needs.
set(VCLINK_TEST_OPTIONS "" CACHE STRING "Compiler options of tests, after those of everything")
set(VCLINK_TEST_LINK_OPTIONS "" CACHE STRING "Linker options of test programs")
add_library(vclink_test_options INTERFACE)
target_compile_options(vclink_test_options INTERFACE ${VCLINK_TEST_OPTIONS})
target_link_options(vclink_test_options INTERFACE ${VCLINK_TEST_LINK_OPTIONS})
function(vclink_configure_test_target target)
    vclink_configure_target(${target})
    target_link_libraries(${target} PRIVATE vclink_test_options)
endfunction()

# Shared libraries and programs lie in the build tree as they do when installed, so that what is
# found relative to them is found in both.
set(VCLINK_STAGE_DIR "${PROJECT_BINARY_DIR}/stage")
