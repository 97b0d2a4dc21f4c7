# SPDX-License-Identifier: MIT
# cmake -D NM=... -D LIBRARY=... -P exports.cmake
# Fails when the library shows a class or function that no header marks for export.
execute_process(COMMAND "${NM}" --dynamic --defined-only --demangle "${LIBRARY}"
    OUTPUT_VARIABLE symbols
    COMMAND_ERROR_IS_FATAL ANY)
if(NOT symbols MATCHES " T fl::i18n::utf8_to_ustring")
    message(FATAL_ERROR "The library does not show what its headers mark.")
endif()
foreach(hidden IN ITEMS "anonymous namespace" LoggerRegistry openNative DescriptorOwner
        findEnglishText "fl::i18n::translate")
    if(symbols MATCHES " [TWVDBRu] [^\n]*${hidden}")
        message(FATAL_ERROR "The library shows a name of its own: ${CMAKE_MATCH_0}")
    endif()
endforeach()
string(REPLACE "\n" ";" symbols "${symbols}")
foreach(symbol IN LISTS symbols)
    if(symbol MATCHES " [TDBR] " AND
            NOT symbol MATCHES "(computils|fl|foundation|resource_core|vclink|vclink_host)::")
        message(FATAL_ERROR "The library shows a name of others: ${symbol}")
    endif()
endforeach()
