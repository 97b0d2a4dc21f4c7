// SPDX-License-Identifier: MIT
#include <mutex>
#include <string>

#include <dlfcn.h>

#include <boost/filesystem/operations.hpp>

#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink_host/installation.hpp"

namespace fl::filesystem
{
namespace
{

/// Returns the folder in which this library is installed, empty if it cannot be found out.
ustring findInstallation()
{
    static const char anchor = 0;
    Dl_info place{};
    if (::dladdr(&anchor, &place) == 0 || place.dli_fname == nullptr)
    {
        return {};
    }
    boost::system::error_code error;
    boost::filesystem::path folder = boost::filesystem::canonical(place.dli_fname, error);
    if (error)
    {
        return {};
    }
    folder = folder.parent_path();
    for (int level = 0; level < VCLINK_HOST_LEVELS_TO_PREFIX; ++level)
    {
        folder = folder.parent_path();
    }
    return fl::i18n::utf8_to_ustring(folder.string());
}

struct InstallPath
{
    std::mutex mutex;
    ustring folder = findInstallation();
};

InstallPath &installPath()
{
    static InstallPath path;
    return path;
}

} // namespace

ustring get_install_path()
{
    InstallPath &path = installPath();
    const std::lock_guard<std::mutex> lock(path.mutex);
    return path.folder;
}

} // namespace fl::filesystem

namespace vclink_host
{

void setInstallPath(const ustring &folder)
{
    fl::filesystem::InstallPath &path = fl::filesystem::installPath();
    const std::lock_guard<std::mutex> lock(path.mutex);
    path.folder = folder;
    while (path.folder.size() > 1 && path.folder.back() == u'/')
    {
        path.folder.pop_back();
    }
}

} // namespace vclink_host
