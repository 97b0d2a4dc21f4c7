# SPDX-License-Identifier: MIT
# Doxygen's pages of the exported headers, in build/PRESET/api/html, for the package of the development
# files. They need no scripts, so the copies of script libraries that Doxygen adds are left out.
find_program(VCLINK_DOXYGEN doxygen)
mark_as_advanced(VCLINK_DOXYGEN)
if(NOT VCLINK_DOXYGEN)
    message(WARNING "Doxygen is not installed: the development package has no pages of the exported headers")
    return()
endif()

set(api_folder "${PROJECT_BINARY_DIR}/api")
file(READ docs/Doxyfile api_settings)
# scripts/docs checks for warnings, with the Doxygen of one system: another one may have more.
file(CONFIGURE OUTPUT "${api_folder}/Doxyfile"
    CONTENT "${api_settings}OUTPUT_DIRECTORY = \"${api_folder}\"\nWARN_AS_ERROR = NO\n" @ONLY)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS docs/Doxyfile)
file(GLOB api_sources CONFIGURE_DEPENDS include/vclink/git/*.hpp)
add_custom_command(OUTPUT "${api_folder}/html/index.html"
    COMMAND "${CMAKE_COMMAND}" -E rm -rf "${api_folder}/html"
    COMMAND "${VCLINK_DOXYGEN}" "${api_folder}/Doxyfile"
    WORKING_DIRECTORY "${PROJECT_SOURCE_DIR}"
    DEPENDS ${api_sources} docs/api.dox "${api_folder}/Doxyfile"
    COMMENT "Pages of the exported headers"
    VERBATIM)
add_custom_target(vclink_api_pages ALL DEPENDS "${api_folder}/html/index.html")

install(DIRECTORY "${api_folder}/html/"
    DESTINATION share/doc/libvclink-git-dev/api
    COMPONENT development
    PATTERN "*.js" EXCLUDE)
