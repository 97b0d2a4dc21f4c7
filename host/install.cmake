# SPDX-License-Identifier: MIT
# The stand-in as a package of its own, apart from the library's: where the host's real SDK is
# installed, it stays away.
install(TARGETS vclink_host EXPORT vclink_host
    LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}"
        COMPONENT host-runtime NAMELINK_COMPONENT host-development)
install(DIRECTORY include/
    DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}/vclink_host"
    COMPONENT host-development
    FILES_MATCHING PATTERN "*.hpp")
vclink_install_package_files(vclink_host "${CMAKE_CURRENT_SOURCE_DIR}/package"
    COMPONENT host-development)

# Found below the place of installation under these names, whatever the folders of others are.
install(DIRECTORY "${VCLINK_STAGE_DIR}/share/locale"
    DESTINATION share
    COMPONENT host-runtime)
install(PROGRAMS bin/lnxhost/vkAutoMerge.sh bin/lnxhost/vkDiff bin/lnxhost/vkMerge
    DESTINATION bin/lnxhost
    COMPONENT host-runtime)
