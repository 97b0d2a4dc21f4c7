// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <vector>

#include "fl/filesystem/path.hpp"
#include "vclink/CMAdapter.hpp"
#include "vclink/WorkingCopyGenerator.hpp"

/// The smallest host that the measured programs can do with.
namespace vclink::bench
{

upath toPath(const std::string &text);

/// One name a line, each made a path below the root.
std::vector<upath> readPaths(const std::string &root, const char *listFile);

/// An adapter whose application shows no progress and asks for nothing.
std::unique_ptr<CMAdapter> makeAdapter(const upath &root);

/// What makes clones, for the same application.
std::unique_ptr<WorkingCopyGenerator> makeGenerator();

} // namespace vclink::bench
