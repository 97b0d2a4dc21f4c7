// SPDX-License-Identifier: MIT
#include <cerrno>
#include <chrono>
#include <string>

#include <fcntl.h>
#include <sys/stat.h>

#include <boost/filesystem/operations.hpp>

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/native_name.hpp"
#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"

namespace fl::filesystem
{
namespace
{

ustring getTemporaryFolder()
{
    boost::system::error_code error;
    const boost::filesystem::path folder = boost::filesystem::temp_directory_path(error);
    return error ? ustring(u"/tmp") : fl::i18n::utf8_to_ustring(folder.string());
}

/// Returns a word of 128 random bits.
ustring makeRandomWord()
{
    boost::system::error_code error;
    const boost::filesystem::path word =
        boost::filesystem::unique_path("%%%%%%%%%%%%%%%%%%%%%%%%%%%%%%%%", error);
    if (error)
    {
        // Without a source of randomness the name is at least new.
        const auto now = std::chrono::steady_clock::now().time_since_epoch().count();
        return fl::i18n::utf8_to_ustring(std::to_string(now));
    }
    return fl::i18n::utf8_to_ustring(word.string());
}

ustring makeName(const ustring &folder, const ustring &prefix, const ustring &extension)
{
    ustring name = folder;
    detail::concatenate_pathname(name, prefix + makeRandomWord(), true);
    if (!extension.empty() && extension.front() != u'.')
    {
        name += u'.';
    }
    return name + extension;
}

} // namespace

ustring tmpnam(const ustring &folder, const ustring &prefix, const ustring &extension)
{
    constexpr int attempts = 16;
    const ustring where = folder.empty() ? getTemporaryFolder() : folder;
    ustring name;
    for (int attempt = 0; attempt < attempts; ++attempt)
    {
        name = makeName(where, prefix, extension);
        const int descriptor = openNative(name, O_RDWR | O_CREAT | O_EXCL, S_IRUSR | S_IWUSR);
        const DescriptorOwner owner(descriptor);
        if (descriptor >= 0 || errno != EEXIST)
        {
            break;
        }
    }
    return name;
}

} // namespace fl::filesystem
