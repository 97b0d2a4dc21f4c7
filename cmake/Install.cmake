# SPDX-License-Identifier: MIT
# Install rules. Each component is a package: runtime and development here, shell if it is built; the stand-in has
# host-runtime and host-development.
install(TARGETS vclink_git EXPORT vclink_git
    LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}"
        COMPONENT runtime NAMELINK_COMPONENT development)
install(DIRECTORY include/
    DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}"
    COMPONENT development
    FILES_MATCHING PATTERN "*.hpp")
vclink_install_package_files(vclink_git "${PROJECT_SOURCE_DIR}/cmake/package"
    COMPONENT development)

# The same layout as in the repository, so that links between documents and examples work. Links of README.md to
# files that are not installed become plain text.
file(READ "${PROJECT_SOURCE_DIR}/README.md" readme)
string(REGEX REPLACE "\\[([^]]*)\\]\\((CONTRIBUTING\\.md|Containerfile|LICENSE)\\)" "\\1" readme "${readme}")
file(WRITE "${PROJECT_BINARY_DIR}/package/README.md" "${readme}")
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS "${PROJECT_SOURCE_DIR}/README.md")
install(FILES "${PROJECT_BINARY_DIR}/package/README.md" CHANGELOG.md SECURITY.md
    DESTINATION share/doc/libvclink-git-dev
    COMPONENT development)
install(DIRECTORY docs
    DESTINATION share/doc/libvclink-git-dev
    COMPONENT development
    FILES_MATCHING PATTERN "*.md" PATTERN "*.png" PATTERN "*.svg")
if(VCLINK_API_PAGES)
    include(cmake/ApiPages.cmake)
endif()
install(DIRECTORY examples/desktop examples/embed examples/integrating
    DESTINATION share/doc/libvclink-git-dev/examples
    COMPONENT development)
install(FILES examples/hostTools.hpp
    DESTINATION share/doc/libvclink-git-dev/examples
    COMPONENT development)

if(VCLINK_BUILD_EXAMPLES)
    install(TARGETS vclink-shell
        RUNTIME DESTINATION "${CMAKE_INSTALL_BINDIR}"
        COMPONENT shell)
    install(FILES examples/shell/completion.bash
        DESTINATION "${CMAKE_INSTALL_DATADIR}/bash-completion/completions"
        RENAME vclink-shell
        COMPONENT shell)
    install(FILES examples/shell/completion.zsh
        DESTINATION "${CMAKE_INSTALL_DATADIR}/zsh/vendor-completions"
        RENAME _vclink-shell
        COMPONENT shell)
endif()
