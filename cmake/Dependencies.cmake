# SPDX-License-Identifier: MIT
# Finds the libraries that the library and its programs need. docs/linking.md has the reasons.
find_package(PkgConfig REQUIRED)
# libgit2 has a CMake package only since 1.9.
pkg_check_modules(libgit2 REQUIRED IMPORTED_TARGET libgit2>=1.5)
if(libgit2_VERSION MATCHES "^1\\.8\\.[01]$")
    message(FATAL_ERROR "libgit2 ${libgit2_VERSION} declares the parents in git_commit_create with another type than "
        "all other releases: install 1.8.2 or later.")
endif()

set(Boost_USE_STATIC_LIBS OFF)
find_package(Boost 1.74 REQUIRED CONFIG COMPONENTS filesystem log thread)

if(VCLINK_HOST STREQUAL "source")
    find_package(Boost 1.74 REQUIRED CONFIG COMPONENTS iostreams locale stacktrace_basic)
    find_package(Gettext REQUIRED)
elseif(VCLINK_HOST STREQUAL "package")
    find_package(vclink_host REQUIRED)
else()
    message(FATAL_ERROR "VCLINK_HOST is '${VCLINK_HOST}'; it may be 'source' or 'package'.")
endif()
