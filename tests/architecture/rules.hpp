// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "SourceTree.hpp"

/// The rules of the house, each as a function that finds what breaks it. A finding is a line for a
/// person: the file, and what is wrong with it.
namespace vclink::test
{

using Findings = std::vector<std::string>;

/// host <- error <- util, options <- main: a file includes files of its own layer and of those
/// below it only. The exported headers include only the host's, and the examples only these two.
Findings findBrokenLayers(const SourceTree &tree);

/// Within a layer each folder is a room: a file includes files of its own room, and of those that
/// the table in rules.cpp gives to it. A folder that the table does not have is a finding too.
Findings findBrokenRooms(const SourceTree &tree);

/// What that table allows and no file needs.
Findings findUnusedArrows(const SourceTree &tree);

/// Beside the host's headers and each other the exported headers include the standard library's,
/// and of Boost what holds a value: optional and variant.
Findings findForeignIncludesOfExportedHeaders(const SourceTree &tree);

/// The library does not know the controls that a host program has over the stand-in, so that it
/// builds against any SDK; the SDK's own headers need none but the export macro.
Findings findUseOfHostControls(const SourceTree &tree);

/// Boost.Log, Boost.Process and Boost.Stacktrace, which are slow to compile, each have one source
/// file of the library and the stand-in, and no header.
Findings findSpreadHeavyLibraries(const SourceTree &tree);

/// A header begins with the licence's line, and its first line of code is "#pragma once".
Findings findHeadersWithoutProlog(const SourceTree &tree);

/// Source positions in the library are literal text, which no edit above them moves.
Findings findLineMacros(const SourceTree &tree);

/// The library opens no file as a stream: a command of another thread would inherit the descriptor.
Findings findFileStreams(const SourceTree &tree);

/// A file has less than 400 lines.
Findings findLongFiles(const SourceTree &tree);

} // namespace vclink::test
