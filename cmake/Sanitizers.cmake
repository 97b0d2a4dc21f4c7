# SPDX-License-Identifier: MIT
# vclink_instrumentation: sanitizers, coverage and recording of reached places, as the preset chooses. Never
# exported. vclink_linked_instrumentation: for targets that only link with them.
add_library(vclink_linked_instrumentation INTERFACE)
add_library(vclink_instrumentation INTERFACE)
target_link_libraries(vclink_instrumentation INTERFACE vclink_linked_instrumentation)
if(VCLINK_SANITIZE)
    list(JOIN VCLINK_SANITIZE "," sanitizers)
    target_compile_options(vclink_instrumentation INTERFACE
        -fsanitize=${sanitizers} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_link_options(vclink_linked_instrumentation INTERFACE -fsanitize=${sanitizers})
    # UBSan's tables of source lines take a third of a program. At a fixed address their hundreds of thousands of
    # pointers need no relocation, which takes a sixth of the time of a short program.
    if("undefined" IN_LIST VCLINK_SANITIZE)
        target_link_options(vclink_linked_instrumentation INTERFACE
            $<$<STREQUAL:$<TARGET_PROPERTY:TYPE>,EXECUTABLE>:-no-pie>)
    endif()
endif()

# Coverage and recording instrument only the library's objects.
if(VCLINK_COVERAGE)
    target_link_options(vclink_linked_instrumentation INTERFACE --coverage)
endif()

function(vclink_measure target)
    if(VCLINK_COVERAGE)
        target_compile_options(${target} PRIVATE --coverage -fprofile-abs-path)
    endif()
    if(VCLINK_RECORD_REACH)
        # Without warnings: they are errors here, and many mutants cause one.
        target_compile_options(${target} PRIVATE
            -fsanitize-coverage=inline-8bit-counters,pc-table -gline-tables-only -w)
    endif()
endfunction()
