# SPDX-License-Identifier: MIT
# cmake -D XGETTEXT=... -D SOURCE_DIR=... -D TEMPLATE=... [-D CHECK_IN=...] -P extract.cmake
# Writes the template of the translations; with CHECK_IN only compares it with a fresh one, which
# is made in that folder.
set(output "${TEMPLATE}")
if(DEFINED CHECK_IN)
    set(output "${CHECK_IN}/fresh.pot")
endif()

execute_process(
    COMMAND "${XGETTEXT}" --language=C++ --from-code=UTF-8 --boost
        --keyword --keyword=VCLINK_TEXT:1c,2 --add-comments=TRANSLATORS --no-location
        --package-name=vclink_git --copyright-holder= -o "${output}"
        host/src/fl/i18n/english_texts.cpp
    WORKING_DIRECTORY "${SOURCE_DIR}"
    COMMAND_ERROR_IS_FATAL ANY)

# The time of the extraction would make each run differ from the last.
file(READ "${output}" text)
string(REGEX REPLACE "\"POT-Creation-Date:[^\n]*\n" "" text "${text}")
string(REPLACE "charset=CHARSET" "charset=UTF-8" text "${text}")
string(REGEX REPLACE "^# SOME DESCRIPTIVE TITLE[^\"]*#, fuzzy\n" "# SPDX-License-Identifier: MIT\n#, fuzzy\n" text "${text}")
file(WRITE "${output}" "${text}")

if(DEFINED CHECK_IN)
    execute_process(
        COMMAND "${CMAKE_COMMAND}" -E compare_files "${TEMPLATE}" "${output}"
        RESULT_VARIABLE differs)
    if(differs)
        message(FATAL_ERROR "The texts have changed: build the target vclink_host_pot.")
    endif()
endif()
