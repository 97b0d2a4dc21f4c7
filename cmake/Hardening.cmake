# SPDX-License-Identifier: MIT
# vclink_hardening: options for the shared libraries and programs that ship, so that a fault in them is harder to
# exploit. Never exported.
add_library(vclink_hardening INTERFACE)
target_compile_options(vclink_hardening INTERFACE -fstack-protector-strong)
if(CMAKE_SYSTEM_PROCESSOR STREQUAL "x86_64")
    target_compile_options(vclink_hardening INTERFACE -fcf-protection=full)
endif()
target_link_options(vclink_hardening INTERFACE
    -Wl,--as-needed -Wl,-z,relro -Wl,-z,now -Wl,-z,noexecstack -Wl,-z,text)
# The C library's checks need an optimised build; the sanitizers have checks of their own.
if(NOT VCLINK_SANITIZE)
    target_compile_options(vclink_hardening INTERFACE
        $<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:-U_FORTIFY_SOURCE -D_FORTIFY_SOURCE=2>)
    # clang's sanitizers need undefined names, which the program defines.
    target_link_options(vclink_hardening INTERFACE -Wl,--no-undefined)
endif()
