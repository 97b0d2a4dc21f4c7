// SPDX-License-Identifier: MIT
#include "util/temporaryFile.hpp"

#include <cerrno>
#include <string>

#include <fcntl.h>
#include <git2/odb.h>
#include <git2/repository.h>
#include <sys/stat.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/diagnosticText.hpp"
#include "error/logging/logger.hpp"
#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/fstream.hpp"
#include "fl/filesystem/operations.hpp"
#include "fl/i18n/convert.hpp"
#include "util/scope/FileDescriptor.hpp"
#include "util/scope/ScopedCleanup.hpp"

namespace vclink::git
{

namespace
{

/// Returns true if there is a file to write to. If the host's tmpnam has returned only a name,
/// creates the file, readable only by its owner. Does not touch a link or anything else in its
/// place.
bool isThere(const ustring &name)
{
    const std::string native = fl::i18n::ustring_to_utf8(name);
    struct stat status = {};
    if (::lstat(native.c_str(), &status) == 0)
    {
        return S_ISREG(status.st_mode);
    }
    constexpr int flags = O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC;
    return errno == ENOENT &&
           FileDescriptor(::open(native.c_str(), flags, S_IRUSR | S_IWUSR)).get() >= 0;
}

void writeFile(const upath &file, const void *data, std::size_t size)
{
    const ustring name = fl::filesystem::detail::make_native_access_form(file.string());
    if (!isThere(name))
    {
        return;
    }
    // A file that was removed since then is not created again.
    fl::filesystem::basic_ofstream<char> stream(name, std::ios_base::in | std::ios_base::out |
                                                          std::ios_base::binary);
    // Intentionally ignores the state of the stream: the command then gets the existing content.
    stream.write(static_cast<const char *>(data), static_cast<std::streamsize>(size));
    stream.close();
}

} // namespace

upath writeTemporaryFile(const void *data, std::size_t size)
{
    upath file(fl::filesystem::tmpnam({}, {}, {}));
    try
    {
        writeFile(file, data, size);
    }
    catch (...)
    {
        removeTemporaryFile(file);
        throw;
    }
    return file;
}

upath writeBlobToTemporaryFile(const git_index_entry &entry, git_repository *repository)
{
    const OwnedHandle<git_odb> database = acquire<git_odb>(git_repository_odb, repository).value();
    const OwnedHandle<git_odb_object> blob =
        acquire<git_odb_object>(git_odb_read, database.get(), &entry.id).value();
    return writeTemporaryFile(git_odb_object_data(blob.get()), git_odb_object_size(blob.get()));
}

void removeTemporaryFile(const upath &file) noexcept
{
    try
    {
        fl::filesystem::remove(file);
    }
    catch (...)
    {
        // Exceptions of the log's sinks are ignored too, because this runs while a scope ends.
        const ScopedCleanup report(
            [&file]
            {
                writeRecord(SeverityException, "Exception caught: ", currentDiagnosticText);
                writeRecord(SeverityStackTrace, "Could not remove temporary file: ",
                            [&file] { return fl::i18n::to_string(file.string()); });
            });
    }
}

} // namespace vclink::git
