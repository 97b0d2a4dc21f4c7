// SPDX-License-Identifier: MIT
#include "HostileRepository.hpp"

#include <algorithm>
#include <map>

#include <boost/algorithm/string/replace.hpp>

#include "support/indexChecksum.hpp"

namespace vclink::fuzz
{
namespace
{

namespace fs = std::filesystem;
using test::GitRepository;

/// Where a file of the input belongs; empty when it belongs nowhere.
std::string placeOf(const std::string &name)
{
    static const std::map<std::string, std::string> places{
        {".gitattributes", ".gitattributes"},
        {".gitignore", ".gitignore"},
        {".gitmodules", ".gitmodules"},
        {"FETCH_HEAD", ".git/FETCH_HEAD"},
        {"HEAD", ".git/HEAD"},
        {"MERGE_HEAD", ".git/MERGE_HEAD"},
        {"MERGE_MODE", ".git/MERGE_MODE"},
        {"MERGE_MSG", ".git/MERGE_MSG"},
        {"config", ".git/config"},
        {"index", ".git/index"},
        {"info/attributes", ".git/info/attributes"},
        {"info/sparse-checkout", ".git/info/sparse-checkout"},
        {"logs/HEAD", ".git/logs/HEAD"},
        {"packed-refs", ".git/packed-refs"},
        {"refs/heads/loose", ".git/refs/heads/loose"}};
    const auto place = places.find(name);
    return place == places.end() ? std::string() : place->second;
}

std::map<std::string, std::string> cutIntoFiles(const std::string &input)
{
    const std::string mark = "\n@@ ";
    std::map<std::string, std::string> files;
    for (std::size_t begin = input.find(mark); begin != std::string::npos;)
    {
        begin += mark.size();
        const std::size_t next = input.find(mark, begin);
        const std::string section = input.substr(begin, next - begin);
        const std::size_t line = std::min(section.find('\n'), section.size());
        files[section.substr(0, line)] = section.substr(std::min(line + 1, section.size()));
        begin = next;
    }
    return files;
}

/// Whether the index claims more entries, or more subtrees of its cached trees, than there is any
/// point in: libgit2 1.5 makes room for as many as it is told before it reads the first, up to the
/// whole memory.
bool claimsTooMuch(const std::string &index)
{
    constexpr std::size_t countBegin = 8;
    constexpr std::size_t digitsTaken = 6;
    const bool hasManyEntries = index.size() > countBegin + 2 &&
                                (index[countBegin] != '\0' || index[countBegin + 1] != '\0');
    std::size_t digits = 0;
    for (std::size_t i = std::min(index.find("TREE"), index.size()); i < index.size(); ++i)
    {
        const bool isDigit = index[i] >= '0' && index[i] <= '9';
        digits = isDigit ? digits + 1 : 0;
        if (digits > digitsTaken)
            return true;
    }
    return hasManyEntries;
}

void makeHistory(GitRepository &repository)
{
    repository.git({"config", "user.name", "Test Person"});
    repository.git({"config", "user.email", "person@example.com"});
    repository.write("file", "1\n2\n3\n");
    repository.write("other", "other\n");
    repository.write("sub/inside", "inside\n");
    repository.symlink("file", "link");
    repository.commitAll("first");
    repository.git({"checkout", "--quiet", "-b", "topic"});
    repository.write("file", "theirs\n2\n3\n");
    repository.write("added", "added\n");
    repository.commitAll("on topic");
    repository.git({"checkout", "--quiet", "-b", "quiet", "main"});
    repository.write("sub/inside", "another\n");
    repository.commitAll("on quiet");
    repository.git({"checkout", "--quiet", "main"});
    repository.write("file", "ours\n2\n3\n");
    repository.commitAll("on main");
    repository.git({"tag", "-m", "a tag", "tag", "topic"});
}

/// What is of the tree beside the objects, which stand where they need not be copied.
void share(const GitRepository &repository, const fs::path &gitFolder, const fs::path &objects)
{
    repository.git({"pack-refs", "--all"});
    fs::remove_all(gitFolder / "objects");
    for (const auto *folder : {"info", "pack"})
        fs::create_directories(gitFolder / "objects" / folder);
    repository.write(fs::relative(gitFolder / "objects/info/alternates", repository.path()),
                     objects.string() + '\n');
}

} // namespace

HostileRepository::HostileRepository()
{
    auto repository = GitRepository::init(template_ / "repository");
    makeHistory(repository);
    const fs::path origin = template_ / "origin";
    repository.git({"repack", "-a", "-d", "--quiet"});
    fs::copy(repository / ".git/objects", objects(), fs::copy_options::recursive);
    repository.git({"clone", "--quiet", "--bare", ".", origin});
    repository.git({"remote", "add", "origin", (run_ / "origin").string()});
    repository.git({"config", "merge.tool.driver", "cp %B %A"});
    repository.git({"update-ref", "refs/remotes/origin/main", "HEAD"});
    share(repository, repository / ".git", objects());
    share(GitRepository(origin), origin, objects());
    for (const auto *name : {"description", "hooks", "logs", "COMMIT_EDITMSG", "ORIG_HEAD"})
    {
        fs::remove_all(repository / ".git" / name);
        fs::remove_all(origin / name);
    }
    fs::create_directories(run_);
    GitRepository(run_).write("beside", "nobody writes here\n");
    restore({});
}

bool HostileRepository::isRefused(const std::string &input)
{
    const auto files = cutIntoFiles(input);
    const auto index = files.find("index");
    return index != files.end() && claimsTooMuch(index->second);
}

void HostileRepository::restore(const std::string &input) const
{
    for (const auto *name : {"repository", "origin"})
    {
        fs::remove_all(run_ / name);
        fs::copy(template_ / name, run_ / name,
                 fs::copy_options::recursive | fs::copy_options::copy_symlinks);
    }
    const GitRepository repository(path());
    repository.write("file", "changed\n");
    repository.write("new", "new\n");
    for (auto &[name, content] : cutIntoFiles(input))
    {
        if (name == "index")
            test::correctChecksum(content);
        else if (name == "config")
            boost::algorithm::replace_all(content, "$TOP", top().string());
        if (!placeOf(name).empty())
            repository.write(placeOf(name), content);
    }
}

std::vector<std::string> HostileRepository::surroundings() const
{
    std::vector<std::string> found{GitRepository(run_).read("beside")};
    for (const auto &folder : {top(), run_, environment_.home(), environment_.temporary()})
    {
        for (const auto &entry : fs::directory_iterator(folder))
            found.push_back(entry.path());
    }
    std::sort(found.begin(), found.end());
    return found;
}

} // namespace vclink::fuzz
