// SPDX-License-Identifier: MIT
#include "util/path/foldersAbove.hpp"

#include <sys/stat.h>

namespace vclink::git
{

bool hasLinkAbove(const std::string &root, const std::string &name)
{
    return anyFolderAbove(name,
                          [&root](const std::string &folder)
                          {
                              struct stat status = {};
                              return ::lstat((root + folder).c_str(), &status) == 0 &&
                                     S_ISLNK(status.st_mode);
                          });
}

} // namespace vclink::git
