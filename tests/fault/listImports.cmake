# SPDX-License-Identifier: MIT
# cmake -D NM=... -D LIBRARY=... -D SHIMS=... -D OPTIONS=... -P listImports.cmake
# Writes, for every function of libgit2 that the library imports, a line for the compiler, which
# makes the function's shim, and one for the linker, which leads the function's callers to it. A new
# call has a shim as soon as it is built.
execute_process(
    COMMAND "${NM}" --dynamic --undefined-only "${LIBRARY}"
    OUTPUT_VARIABLE symbols
    COMMAND_ERROR_IS_FATAL ANY)
string(REGEX MATCHALL " U git_[a-z0-9_]+" imports "${symbols}")
if(NOT imports)
    message(FATAL_ERROR "${LIBRARY} imports nothing of libgit2")
endif()
list(TRANSFORM imports REPLACE "^ U " "")
list(SORT imports)
list(TRANSFORM imports REPLACE ".+" "VCLINK_SHIM(\\0)\n" OUTPUT_VARIABLE shims)
list(TRANSFORM imports REPLACE ".+" "-Wl,--wrap=\\0\n" OUTPUT_VARIABLE options)
list(JOIN shims "" shims)
list(JOIN options "" options)
file(WRITE "${SHIMS}" "${shims}")
file(WRITE "${OPTIONS}" "${options}")
