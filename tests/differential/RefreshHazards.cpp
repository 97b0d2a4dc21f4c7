// SPDX-License-Identifier: MIT
#include "RefreshHazards.hpp"

#include <algorithm>
#include <chrono>
#include <filesystem>

#include "RandomContent.hpp"
#include "quoting.hpp"
#include "support/indexChecksum.hpp"
#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

namespace fs = std::filesystem;

const std::vector<std::string> attributeTexts{"* text=auto\n",
                                              "* text\n",
                                              "* -text\n",
                                              "* text eol=crlf\n",
                                              "*.txt text=auto eol=crlf\n*.c text\n",
                                              "a* -text\n* text=auto eol=lf\n",
                                              "* ident\n"};

std::string withOtherLineEnds(Random &random, const std::string &content)
{
    std::string changed;
    const std::size_t kind = random.below(3);
    for (const char byte : content)
    {
        if (byte == '\n' && (kind == 0 || (kind == 1 && random.chance(50))))
        {
            changed += '\r';
        }
        if (byte != '\r' || kind != 2)
        {
            changed += byte;
        }
    }
    return changed;
}

} // namespace

RefreshHazards::RefreshHazards(Random &random, const GitRepository &repository)
    : random_(random), repository_(repository),
      tracked_(split(repository.git({"ls-files", "-z"}), '\0'))
{
    tracked_.erase(std::unique(tracked_.begin(), tracked_.end()), tracked_.end());
}

void RefreshHazards::add()
{
    configure("core.autocrlf", {"true", "input", "false"});
    configure("core.safecrlf", {"true", "warn", "false"});
    configure("core.fileMode", {"false"});
    configure("core.symlinks", {"false"});
    configure("core.trustctime", {"false"});
    if (random_.chance(50))
    {
        writeAttributes();
    }
    const unsigned rate = random_.chance(50) ? 0 : 15;
    for (const auto &path : tracked_)
    {
        if (random_.chance(rate) && isFile(path))
        {
            changeLineEnds(path);
        }
    }
    setFlag("--skip-worktree", 60);
    setFlag("--assume-unchanged", 30);
    for (const auto &path : tracked_)
    {
        if (random_.chance(10) && isFile(path))
        {
            random_.chance(60) ? changeTimes(path) : rewriteUnseen(path);
        }
    }
    if (random_.chance(15))
    {
        collide();
    }
    dateIndex();
    if (random_.chance(15) && !tracked_.empty())
    {
        hide(random_.pick(tracked_));
    }
}

void RefreshHazards::note(const std::string &line)
{
    script_ += "  " + line + '\n';
}

bool RefreshHazards::isFile(const std::string &path) const
{
    std::error_code missing;
    const fs::path parent = (repository_ / path).parent_path();
    return fs::canonical(parent, missing) == parent &&
           fs::symlink_status(repository_ / path, missing).type() == fs::file_type::regular;
}

void RefreshHazards::configure(const std::string &name, const std::vector<std::string> &values)
{
    if (random_.chance(12))
    {
        const std::string &value = random_.pick(values);
        repository_.git({"config", name, value});
        note("git config " + name + ' ' + value);
    }
}

void RefreshHazards::writeAttributes()
{
    const std::string path = ".gitattributes";
    std::error_code missing;
    if (fs::exists(fs::symlink_status(repository_ / path, missing)))
    {
        return;
    }
    const std::string &first = random_.pick(attributeTexts);
    repository_.write(path, first);
    note("write " + path + " with " + quote(first));
    if (random_.chance(60))
    {
        repository_.add({path});
        note("git add " + path);
    }
    if (random_.chance(15))
    {
        repository_.remove(path);
        note("remove " + path);
    }
    else if (random_.chance(20))
    {
        const std::string &second = random_.pick(attributeTexts);
        repository_.write(path, second);
        note("write " + path + " with " + quote(second));
    }
}

void RefreshHazards::changeLineEnds(const std::string &path)
{
    const std::string content = withOtherLineEnds(random_, repository_.read(path));
    repository_.write(path, content);
    note("write " + quote(path) + " with " + quote(content));
}

void RefreshHazards::setFlag(const std::string &flag, unsigned percent)
{
    if (!random_.chance(25))
    {
        return;
    }
    for (const auto &path : tracked_)
    {
        // Not every path has an entry that can have it: not one in conflict.
        if (!random_.chance(percent) ||
            !repository_.tryGit({"update-index", flag, "--", path}).succeeded())
        {
            continue;
        }
        note("git update-index " + flag + ' ' + quote(path));
        if (random_.chance(50) && isFile(path))
        {
            repository_.remove(path);
            note("remove " + quote(path));
        }
        else if (random_.chance(30) && isFile(path))
        {
            repository_.write(path, makeContent(random_));
            note("write " + quote(path));
        }
    }
}

void RefreshHazards::changeTimes(const std::string &path)
{
    const auto hours = std::chrono::hours(static_cast<int>(random_.below(3)) - 1);
    fs::last_write_time(repository_ / path, fs::file_time_type::clock::now() + hours);
    note("touch " + quote(path));
}

/// The same size and the same time.
void RefreshHazards::rewriteUnseen(const std::string &path)
{
    const auto time = fs::last_write_time(repository_ / path);
    const std::string content = makeSameSize(random_, repository_.read(path));
    repository_.write(path, content);
    fs::last_write_time(repository_ / path, time);
    note("write " + quote(path) + " unseen with " + quote(content));
}

/// Before all files, so that every entry is racy, or after them.
void RefreshHazards::dateIndex()
{
    const fs::path index = repository_ / ".git/index";
    if (random_.chance(30) && fs::exists(index))
    {
        const auto hours = std::chrono::hours(random_.chance(50) ? -5 : 5);
        fs::last_write_time(index, fs::file_time_type::clock::now() + hours);
        note("date the index " + std::to_string(hours.count()) + " hours");
    }
}

/// git makes no such index, but there may be one.
void RefreshHazards::collide()
{
    const std::string folder = "zq";
    const std::string standIn = folder + "0b";
    const std::string inside = folder + "/b";
    repository_.write(folder, "file\n");
    repository_.write(standIn, "inside\n");
    repository_.add({folder, standIn});
    repository_.remove(standIn);
    std::string index = repository_.read(".git/index");
    const auto position = index.find(standIn);
    index.replace(position, standIn.size(), inside);
    correctChecksum(index);
    repository_.write(".git/index", index);
    note("index with both " + folder + " and " + inside);
    if (random_.chance(50))
    {
        repository_.remove(folder);
        repository_.write(inside, random_.chance(50) ? "inside\n" : "changed\n");
        note("write " + inside);
    }
    else if (random_.chance(50))
    {
        repository_.write(folder, "changed\n");
        note("write " + folder);
    }
}

void RefreshHazards::hide(const std::string &path)
{
    const auto slash = path.rfind('/');
    const std::string hidden =
        slash != std::string::npos && random_.chance(50) ? path.substr(0, slash) : path;
    std::error_code missing;
    const auto type = fs::symlink_status(repository_ / hidden, missing).type();
    if (type == fs::file_type::regular || type == fs::file_type::directory)
    {
        const unsigned mode = random_.pick(std::vector<unsigned>{0000, 0311, 0444});
        repository_.setMode(hidden, mode);
        note("chmod " + std::to_string(mode) + ' ' + quote(hidden));
        hasUnreadable_ = true;
    }
}

} // namespace vclink::test
