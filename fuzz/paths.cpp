// SPDX-License-Identifier: MIT
// What is done to paths before libgit2 and after it. Input, cut at NULs: the root of a working copy
// and a path, where "/" is a folder with links and files, and another name.
#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>

#include <boost/filesystem/exception.hpp>
#include <git2.h>

#include "check.hpp"
#include "fl/filesystem/detail/path_text.hpp"
#include "fl/i18n/convert.hpp"
#include "support/GitRepository.hpp"
#include "support/TemporaryFolder.hpp"
#include "support/relativePath.hpp"
#include "support/text.hpp"
#include "util/path/PathspecArray.hpp"
#include "util/path/paths.hpp"
#include "util/path/pathspecEscape.hpp"

using fl::i18n::ustring_to_utf8;
using fl::i18n::utf8_to_ustring;
using vclink::fuzz::require;
using vclink::test::asPath;

namespace
{

/// Working copies and links into, within and out of them.
class Place
{
  public:
    Place()
    {
        git_libgit2_init();
        const vclink::test::GitRepository tree(folder_.path());
        for (const auto *file : {"root/file", "root/sub/dir/file", "root/x\\y", "other/deep/file"})
            tree.write(file, "x");
        tree.symlink("root", "link");
        tree.symlink("../other", "root/out");
        tree.symlink("sub/dir", "root/in");
        tree.symlink("sub/dir/file", "root/tofile");
        tree.symlink("nowhere", "root/dangling");
        tree.symlink("loop", "root/loop");
        tree.symlink("../root/sub", "other/roundabout");
    }
    Place(const Place &) = delete;
    Place &operator=(const Place &) = delete;
    ~Place()
    {
        git_libgit2_shutdown();
    }

    /// A path that begins with a slash begins here.
    std::string resolve(const std::string &path) const
    {
        return !path.empty() && path.front() == '/' ? folder_.path().string() + path : path;
    }

  private:
    vclink::test::TemporaryFolder folder_;
};

/// What a call gives; nothing when the file system refuses.
template <class Call> std::optional<std::string> attempt(Call call)
{
    try
    {
        return call();
    }
    catch (const boost::filesystem::filesystem_error &)
    {
        return std::nullopt;
    }
}

/// @return the path below the root; empty when it can't be told or is none
std::string checkRelative(const std::string &root, const std::string &path)
{
    const auto relative = attempt(
        [&] { return ustring_to_utf8(vclink::git::relativeToRoot(asPath(root), asPath(path))); });
    auto plain = attempt([&] { return vclink::test::relativeOfBoost174(path, root); });
    if (plain)
        std::replace(plain->begin(), plain->end(), '\\', '/');
    require(relative == plain, "a path is what it is relative to the root");
    return relative.value_or(std::string());
}

/// Whether each element is a name, as in what Git reports.
bool isNameInTree(const std::string &path)
{
    const std::string enclosed = '/' + path + '/';
    return enclosed.find("//") == std::string::npos && enclosed.find("/./") == std::string::npos &&
           enclosed.find("/../") == std::string::npos;
}

bool matches(const std::string &pattern, const std::string &name)
{
    const vclink::git::PathspecArray patterns({pattern});
    git_pathspec *made = nullptr;
    require(git_pathspec_new(&made, vclink::git::getArrayPointer(patterns)) == 0,
            "libgit2 reads a pattern");
    const std::unique_ptr<git_pathspec, decltype(&git_pathspec_free)> pathspec(made,
                                                                               git_pathspec_free);
    return git_pathspec_matches_path(made, GIT_PATHSPEC_DEFAULT, name.c_str()) == 1;
}

void checkPatterns(const std::string &name, const std::string &other)
{
    if (!isNameInTree(name) || !isNameInTree(other))
        return;
    // A pattern without wildcards means all below a folder of the name as well.
    const bool isMeant = other == name || other.compare(0, name.size() + 1, name + '/') == 0;
    const std::string exact = vclink::git::escapeExactPathspec(name);
    require(matches(exact, name), "an exact pattern means its name");
    require(isMeant || !matches(exact, other), "an exact pattern means no other name");
    if (name.find_first_of("*?[\\") == std::string::npos)
    {
        const std::string escaped = vclink::git::escapePathspec(name);
        require(matches(escaped, name), "a pattern means its name");
        require(isMeant || !matches(escaped, other), "a pattern means no other name");
    }
}

void checkFilePathspec(const std::string &root, const std::string &path)
{
    const auto pattern = attempt(
        [&]
        {
            const vclink::git::PathspecArray patterns =
                vclink::git::makeFilePathspec({asPath(path)}, asPath(root));
            require(patterns.array().count == 1, "a list of patterns has one a file");
            return std::string(patterns.array().strings[0]);
        });
    require(pattern != "" && pattern != ".", "no pattern of a file means everything");
    const auto below = attempt(
        [&]
        {
            const auto patterns = vclink::git::makeFolderPathspec(asPath(path), asPath(root));
            return std::string(patterns.array().strings[0]);
        });
    require(!below || below == "*" || below->compare(below->size() - 2, 2, "/*") == 0,
            "the pattern of a folder means what is below it");
}

void checkJoin(const std::string &root, const std::string &name)
{
    std::string plain = root;
    const bool bringsOne = !plain.empty() && plain.back() == '/';
    if (bringsOne && !name.empty() && name.front() == '/')
        plain.pop_back();
    else if (!plain.empty() && !name.empty() && !bringsOne && name.front() != '/')
        plain += '/';
    plain += name;
    for (const bool native : {true, false})
    {
        const upath joined =
            vclink::git::joinRepositoryPath(upath(utf8_to_ustring(root), native), name.c_str());
        require(joined.string() == utf8_to_ustring(plain), "a name is joined by one separator");
        require(joined.native() == native, "a path keeps its form");
    }
}

void checkExtension(const std::string &path, const std::string &extension)
{
    const std::size_t end = path.find_last_not_of('/') + 1;
    ustring replaced = utf8_to_ustring(path);
    fl::filesystem::detail::replace_extension(replaced, utf8_to_ustring(extension));
    const auto plain = std::filesystem::path(path.substr(0, end)).replace_extension(extension);
    require(ustring_to_utf8(replaced) == (end == 0 ? path : plain.string() + path.substr(end)),
            "the last name's extension is replaced");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    static const Place place;
    const auto pieces = vclink::fuzz::cut(vclink::fuzz::bytesOf(data, size), '\0', 3);
    const std::string root = place.resolve(pieces[0]);
    const std::string path = place.resolve(pieces[1]);
    // A NUL ends a name for the system.
    const std::string other = pieces[2].substr(0, pieces[2].find('\0'));
    const std::string relative = checkRelative(root, path);
    checkPatterns(pieces[1], other);
    checkPatterns(relative, other);
    checkFilePathspec(root, path);
    checkJoin(pieces[0], pieces[1]);
    checkExtension(pieces[1], other);
    return 0;
}
