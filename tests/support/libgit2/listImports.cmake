# SPDX-License-Identifier: MIT
# cmake -D NM=... -D OBJECTS=... -D SHIMS=... -D OPTIONS=... -P listImports.cmake
# Writes, for every function of libgit2 that the library calls, a line for the compiler, which
# makes the function's shim, and one for the linker, which leads the function's callers to it. A new
# call has a shim as soon as it is built. Files with nothing new keep their time, so that nothing is
# compiled or linked because of them.
execute_process(
    COMMAND "${NM}" --undefined-only ${OBJECTS}
    OUTPUT_VARIABLE symbols
    COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL " U git_[a-z0-9_]+" imports "${symbols}")
if(NOT imports)
    message(FATAL_ERROR "the library's objects call nothing of libgit2")
endif()
list(TRANSFORM imports REPLACE "^ U " "")
list(REMOVE_DUPLICATES imports)
list(SORT imports)
list(TRANSFORM imports REPLACE ".+" "VCLINK_SHIM(\\0)\n" OUTPUT_VARIABLE shims)
list(TRANSFORM imports REPLACE ".+" "-Wl,--wrap=\\0\n" OUTPUT_VARIABLE options)
list(JOIN shims "" shims)
list(JOIN options "" options)
file(CONFIGURE OUTPUT "${SHIMS}" CONTENT "${shims}" @ONLY)
file(CONFIGURE OUTPUT "${OPTIONS}" CONTENT "${options}" @ONLY)
