# SPDX-License-Identifier: MIT
# Debian packages, one for each component: `cpack -G DEB` in a build folder.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME vclink-git)
set(CPACK_PACKAGE_VENDOR "vclink")
set(CPACK_PACKAGE_CONTACT "vclink developers <vclink@localhost>")
# Each package has a summary of its own.
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")
set(CPACK_PACKAGE_VERSION "${PROJECT_VERSION}")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_RESOURCE_FILE_LICENSE "${PROJECT_SOURCE_DIR}/LICENSE")

set(CPACK_COMPONENTS_ALL runtime development)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
# Debug symbols are in packages of their own, with the extension ddeb.
set(CPACK_DEBIAN_DEBUGINFO_PACKAGE ON)

# dpkg-shlibdeps finds the dependencies on other libraries; those between our packages are listed below.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS "${VCLINK_STAGE_DIR}/${CMAKE_INSTALL_LIBDIR}")
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")

# The licence in the form that Debian's tools read: indented, with a full stop in empty lines.
file(READ "${PROJECT_SOURCE_DIR}/LICENSE" licence)
string(REGEX REPLACE ".*\nCopyright \\(c\\) ([^\n]+)\n+(.*)" "\\1" holder "${licence}")
string(REGEX REPLACE ".*\nCopyright \\(c\\) ([^\n]+)\n+(.*[^\n])\n*" "\n\\2" terms "${licence}")
string(REGEX REPLACE "\n([^\n])" "\n \\1" terms "${terms}")
string(REPLACE "\n\n" "\n .\n" terms "${terms}")
set(copyright "${PROJECT_BINARY_DIR}/package/copyright")
file(CONFIGURE OUTPUT "${copyright}" CONTENT
"Format: https://www.debian.org/doc/packaging-manuals/copyright-format/1.0/
Upstream-Name: vclink-git

Files: *
Copyright: @holder@
License: Expat@terms@
" @ONLY)

# vclink_compress(FILE RESULT): compresses a document as Debian requires, without a name or a time inside.
find_program(VCLINK_GZIP gzip REQUIRED)
mark_as_advanced(VCLINK_GZIP)
function(vclink_compress file result)
    execute_process(COMMAND "${VCLINK_GZIP}" -9nc INPUT_FILE "${file}" OUTPUT_FILE "${result}"
        COMMAND_ERROR_IS_FATAL ANY)
    set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS "${file}")
endfunction()

set(changelog "${PROJECT_BINARY_DIR}/package/changelog")
file(CONFIGURE OUTPUT "${changelog}" CONTENT
"vclink-git (@PROJECT_VERSION@) unstable; urgency=medium

  * CHANGELOG.md in libvclink-git-dev lists the changes.

 -- @CPACK_PACKAGE_CONTACT@  Sun, 01 Nov 2026 12:00:00 +0000
" @ONLY)
vclink_compress("${changelog}" "${changelog}.gz")

# Makes dpkg update the cache of shared libraries.
set(triggers "${PROJECT_BINARY_DIR}/package/triggers")
file(WRITE "${triggers}" "activate-noawait ldconfig\n")

# Remarks of lintian that do not apply, with the reason.
set(reason_bogus-mail-host "The packages are made where they are used, and have no maintainer.")
set(reason_bogus-mail-host-in-debian-changelog "${reason_bogus-mail-host}")
set(reason_maintscript-calls-ldconfig "CPack's own scripts, beside the trigger.")
set(reason_subdir-in-usr-bin "The application looks for its launchers there.")

# vclink_package(COMPONENT NAME SECTION SUMMARY [DEPENDS text] [SUGGESTS text] [LINTIAN tag...] [TRIGGERS]): makes a
# component a package; TRIGGERS is for packages with a shared library.
macro(vclink_package component name section summary)
    cmake_parse_arguments(package "TRIGGERS" "DEPENDS;SUGGESTS" "LINTIAN" ${ARGN})
    string(TOUPPER "${component}" upper)
    set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${name})
    set(CPACK_DEBIAN_${upper}_PACKAGE_SECTION ${section})
    set(CPACK_COMPONENT_${upper}_DESCRIPTION "${summary}")
    set(CPACK_DEBIAN_${upper}_PACKAGE_DEPENDS "${package_DEPENDS}")
    set(CPACK_DEBIAN_${upper}_PACKAGE_SUGGESTS "${package_SUGGESTS}")
    if(package_TRIGGERS)
        set(CPACK_DEBIAN_${upper}_PACKAGE_CONTROL_EXTRA "${triggers}")
    endif()
    set(overrides "${PROJECT_BINARY_DIR}/package/${name}.overrides")
    file(WRITE "${overrides}" "")
    foreach(tag IN ITEMS bogus-mail-host bogus-mail-host-in-debian-changelog ${package_LINTIAN})
        file(APPEND "${overrides}" "# ${reason_${tag}}\n${name}: ${tag}\n")
    endforeach()
    install(FILES "${copyright}" "${changelog}.gz"
        DESTINATION share/doc/${name}
        COMPONENT ${component})
    install(FILES "${overrides}"
        DESTINATION share/lintian/overrides
        RENAME ${name}
        COMPONENT ${component})
endmacro()

# The first packages of libgit2 with the fixes that docs/linking.md lists. The dependency that dpkg-shlibdeps finds
# allows older ones.
set(safe_libgit2_1.5 "1.5.1+ds-1+deb12u2")
set(safe_libgit2_1.8 "1.8.7")
set(safe_libgit2_1.9 "1.9.7")
# Debian 13 has them in a package with a lower number.
cmake_host_system_information(RESULT system QUERY DISTRIB_ID DISTRIB_VERSION_ID)
if(system STREQUAL "debian;13")
    set(safe_libgit2_1.9 "1.9.0+ds-2+deb13u1")
endif()
string(REGEX MATCH "^[0-9]+\\.[0-9]+" libgit2_series "${libgit2_VERSION}")
set(safe_libgit2 "")
if(DEFINED safe_libgit2_${libgit2_series})
    set(safe_libgit2 "libgit2-${libgit2_series} (>= ${safe_libgit2_${libgit2_series}})")
endif()
set(VCLINK_LIBGIT2_PACKAGE "${safe_libgit2}"
    CACHE STRING "libgit2, as the library's Debian package depends on it")
if(NOT VCLINK_LIBGIT2_PACKAGE)
    message(WARNING "No release of libgit2 ${libgit2_series} has all known fixes: set "
        "VCLINK_LIBGIT2_PACKAGE to a package that has them")
endif()

set(runtime libvclink-git${PROJECT_VERSION_MAJOR})
set(host_runtime libvclink-host${PROJECT_VERSION_MAJOR})
set(runtime_depends "${host_runtime} (>= ${PROJECT_VERSION})")
if(VCLINK_LIBGIT2_PACKAGE)
    string(APPEND runtime_depends ", ${VCLINK_LIBGIT2_PACKAGE}")
endif()
vclink_package(runtime ${runtime} libs
    "Git back end of a desktop application
 The shared library that answers the application's source-control interfaces."
    DEPENDS "${runtime_depends}"
    LINTIAN maintscript-calls-ldconfig
    TRIGGERS)
vclink_package(development libvclink-git-dev libdevel
    "Git back end of a desktop application, for developers
 Headers, and what finds the library from CMake and from pkg-config."
    DEPENDS "${runtime} (= ${PROJECT_VERSION}), libvclink-host-dev (>= ${PROJECT_VERSION}), libboost-dev (>= 1.74)"
    # For hosts that use the type of one result, git_oid.
    SUGGESTS "libgit2-dev")
if(VCLINK_BUILD_EXAMPLES)
    set(manual "${PROJECT_BINARY_DIR}/package/vclink-shell.1.gz")
    vclink_compress("${PROJECT_SOURCE_DIR}/examples/shell/vclink-shell.1" "${manual}")
    install(FILES "${manual}"
        DESTINATION "${CMAKE_INSTALL_MANDIR}/man1"
        COMPONENT shell)
    list(APPEND CPACK_COMPONENTS_ALL shell)
    vclink_package(shell vclink-shell vcs
        "Terminal host of a Git back end
 A program that plays the desktop application in a terminal."
        DEPENDS "${runtime} (>= ${PROJECT_VERSION}), ${host_runtime} (>= ${PROJECT_VERSION})")
endif()
if(VCLINK_HOST STREQUAL "source")
    list(APPEND CPACK_COMPONENTS_ALL host-runtime host-development)
    vclink_package(host-runtime ${host_runtime} libs
        "Stand-in for the SDK of a desktop application
 It gives way to the application's own SDK."
        LINTIAN maintscript-calls-ldconfig subdir-in-usr-bin
        TRIGGERS)
    vclink_package(host-development libvclink-host-dev libdevel
        "Stand-in for the SDK of a desktop application, for developers
 Headers, and what finds the stand-in from CMake and from pkg-config."
        DEPENDS "${host_runtime} (= ${PROJECT_VERSION}), libboost-dev (>= 1.74)")
endif()
include(CPack)
