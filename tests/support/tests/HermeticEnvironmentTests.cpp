// SPDX-License-Identifier: MIT
#include <cstdlib>
#include <fstream>
#include <memory>
#include <string>

#include <dlfcn.h>
#include <git2.h>
#include <gtest/gtest.h>

#include "support/Command.hpp"
#include "support/HermeticEnvironment.hpp"
#include "support/LibGit2Session.hpp"
#include "support/TemporaryFolder.hpp"

namespace
{

using namespace vclink::test;

std::string variable(const char *name)
{
    const char *value = std::getenv(name);
    return value != nullptr ? value : "(unset)";
}

/// What libgit2 reads for a key outside of any repository.
std::string readConfiguration(const char *key)
{
    git_config *raw = nullptr;
    EXPECT_EQ(git_config_open_default(&raw), 0);
    const std::unique_ptr<git_config, void (*)(git_config *)> config(raw, git_config_free);
    git_buf value{};
    const int code = git_config_get_string_buf(&value, raw, key);
    std::string text = code == 0 ? std::string(value.ptr, value.size) : "(unset)";
    git_buf_dispose(&value);
    return text;
}

void writeGlobalConfiguration(const HermeticEnvironment &environment, const std::string &value)
{
    std::ofstream(environment.home() / ".gitconfig") << "[vclink]\n\tkey = " << value << "\n";
}

TEST(HermeticEnvironment, HidesThePerson)
{
    ::setenv("GIT_DIR", "/nonexistent", 1);
    ::setenv("GIT_AUTHOR_NAME", "Somebody", 1);
    ::setenv("GIT_CONFIG_GLOBAL", "/nonexistent", 1);
    ::setenv("LANG", "de_DE.UTF-8", 1);
    ::setenv("USER", "somebody", 1);
    const TemporaryFolder folder;
    const HermeticEnvironment environment(folder.path());
    for (const char *name : {"GIT_DIR", "GIT_AUTHOR_NAME", "GIT_CONFIG_GLOBAL", "LANG", "USER"})
        EXPECT_EQ(variable(name), "(unset)") << name;
    EXPECT_EQ(variable("HOME"), folder / "home");
    EXPECT_EQ(variable("XDG_CONFIG_HOME"), folder / "home/.config");
    EXPECT_EQ(variable("TMPDIR"), folder / "tmp");
    EXPECT_EQ(variable("GIT_CONFIG_NOSYSTEM"), "1");
    EXPECT_EQ(variable("LC_ALL"), "C.UTF-8");
    EXPECT_NE(variable("PATH"), "(unset)");
}

TEST(HermeticEnvironment, PutsBackTheWholeEnvironment)
{
    ::setenv("HOME", "/home/before", 1);
    ::setenv("VCLINK_EMPTY", "", 1);
    ::setenv("GIT_DIR", "/nonexistent", 1);
    ::unsetenv("VCLINK_NEW");
    {
        const TemporaryFolder folder;
        const HermeticEnvironment environment(folder.path());
        ::setenv("VCLINK_NEW", "1", 1);
        ::unsetenv("VCLINK_EMPTY");
    }
    EXPECT_EQ(variable("HOME"), "/home/before");
    EXPECT_EQ(variable("VCLINK_EMPTY"), "");
    EXPECT_EQ(variable("GIT_DIR"), "/nonexistent");
    EXPECT_EQ(variable("VCLINK_NEW"), "(unset)");
}

TEST(HermeticEnvironment, LeavesGitWithoutAnyConfiguration)
{
    const TemporaryFolder folder;
    const HermeticEnvironment environment(folder.path());
    const auto list = Command({"git", "config", "--list"}).in(folder.path()).run();
    EXPECT_TRUE(list.succeeded()) << list.errors;
    EXPECT_EQ(list.output, "");
}

TEST(HermeticEnvironment, LeavesLibGit2WithoutTheCertificatesOfTheMachine)
{
    using Reading = int(void *, const char *);
    auto *const read =
        reinterpret_cast<Reading *>(::dlsym(RTLD_DEFAULT, "mbedtls_x509_crt_parse_file"));
    // A libgit2 with another TLS has no such function.
    if (read == nullptr)
        return;
    // Neither file exists. Only the second is looked for.
    EXPECT_EQ(read(nullptr, "/etc/nonexistent"), 0);
    EXPECT_NE(read(nullptr, "/nonexistent"), 0);
}

TEST(HermeticEnvironment, IsWhatALaterStartOfLibGit2FindsAndIsToldToOneThatRunsAlready)
{
    for (const bool runs : {false, true})
    {
        if (runs)
            git_libgit2_init();
        for (const std::string value : {"first", "second"})
        {
            const TemporaryFolder folder;
            const HermeticEnvironment environment(folder.path());
            writeGlobalConfiguration(environment, value);
            git_libgit2_init();
            EXPECT_EQ(readConfiguration("vclink.key"), value);
            git_libgit2_shutdown();
        }
    }
    EXPECT_EQ(git_libgit2_shutdown(), 0) << "the environment has kept libgit2 running";
}

TEST(HermeticEnvironment, GivesARunningLibGit2ItsFormerPlacesBack)
{
    const TemporaryFolder outer;
    const HermeticEnvironment before(outer.path());
    writeGlobalConfiguration(before, "before");
    git_libgit2_init();
    {
        const TemporaryFolder folder;
        const HermeticEnvironment environment(folder.path());
        EXPECT_EQ(readConfiguration("vclink.key"), "(unset)");
    }
    EXPECT_EQ(readConfiguration("vclink.key"), "before");
    git_libgit2_shutdown();
}

TEST(LibGit2Session, ReadsNoConfigurationOfTheSystem)
{
    const TemporaryFolder folder;
    const HermeticEnvironment environment(folder.path());
    const LibGit2Session session(environment);
    git_buf path{};
    ASSERT_EQ(git_libgit2_opts(GIT_OPT_GET_SEARCH_PATH, GIT_CONFIG_LEVEL_SYSTEM, &path), 0);
    EXPECT_EQ(std::string(path.ptr), folder / "etc");
    git_buf_dispose(&path);
}

} // namespace
