// SPDX-License-Identifier: MIT
#include "InstalledFixture.hpp"

#include <algorithm>
#include <chrono>
#include <stdexcept>

namespace vclink::test
{

std::string runToSuccess(Command command)
{
    const CommandResult result = command.timeout(std::chrono::minutes(4)).run();
    if (!result.succeeded())
    {
        throw std::runtime_error(command.text() + (result.timedOut ? " took too long\n" : "\n") +
                                 result.output + result.errors);
    }
    return result.output;
}

std::vector<std::string> filesBelow(const std::filesystem::path &folder)
{
    std::vector<std::string> names;
    for (const auto &entry : std::filesystem::recursive_directory_iterator(folder))
    {
        if (!entry.is_directory())
        {
            names.push_back(entry.path().lexically_relative(folder).string());
        }
    }
    std::sort(names.begin(), names.end());
    return names;
}

void InstalledFixture::install(const std::filesystem::path &prefix,
                               const std::vector<std::string> &components) const
{
    for (const auto &component : components)
    {
        runToSuccess(Command({VCLINK_CMAKE, "--install", VCLINK_BUILD_FOLDER, "--prefix",
                              prefix.string(), "--component", component, "--strip"}));
    }
}

std::filesystem::path InstalledFixture::installAndMove() const
{
    install(folder() / "first", {"runtime", "development", "host-runtime", "host-development"});
    const std::filesystem::path moved = folder() / "second";
    std::filesystem::rename(folder() / "first", moved);
    return moved;
}

std::filesystem::path InstalledFixture::buildAgainst(const std::filesystem::path &prefix,
                                                     const std::filesystem::path &project) const
{
    const std::filesystem::path build = folder() / "build";
    const std::string compiler = "CMAKE_CXX_COMPILER=" VCLINK_COMPILER;
    runToSuccess(Command({VCLINK_CMAKE, "-G", "Ninja", "-S", project.string(), "-B", build.string(),
                          "-D", compiler, "-D", "CMAKE_PREFIX_PATH=" + prefix.string()})
                     .withoutEnvironment("CMAKE_C_COMPILER_LAUNCHER")
                     .withoutEnvironment("CMAKE_CXX_COMPILER_LAUNCHER"));
    runToSuccess(Command({VCLINK_CMAKE, "--build", build.string(), "--verbose"}));
    return build;
}

GitRepository InstalledFixture::makeWorkingCopy() const
{
    auto repository = makeRepository("working copy");
    for (const auto *name : {"clean.txt", "gone.txt", "modified.txt", "removed.txt"})
    {
        repository.write(name, "first\n");
    }
    repository.commitAll("first");
    repository.write("modified.txt", "second\n");
    repository.remove("gone.txt");
    repository.git({"rm", "--quiet", "removed.txt"});
    repository.write("added.txt", "new\n");
    repository.add({"added.txt"});
    repository.write("other.txt", "new\n");
    return repository;
}

std::string InstalledFixture::describeWorkingCopy(const GitRepository &repository)
{
    const std::string root = repository.path().string() + "/";
    return "on main\nadded " + root + "added.txt\nmissing " + root + "gone.txt\nmodified " + root +
           "modified.txt\nunversioned " + root + "other.txt\ndeleted " + root + "removed.txt\n";
}

} // namespace vclink::test
