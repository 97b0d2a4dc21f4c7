// SPDX-License-Identifier: MIT
#include "support/HermeticEnvironment.hpp"

#include <cstdlib>
#include <string_view>

#include <git2.h>
#include <unistd.h>

#include "support/interposition.hpp"
#include "support/strings.hpp"

namespace vclink::test
{
namespace
{

std::vector<std::string> readEnvironment()
{
    std::vector<std::string> variables;
    for (char **variable = ::environ; variable != nullptr && *variable != nullptr; ++variable)
        variables.emplace_back(*variable);
    return variables;
}

void setVariable(const std::string &name, const std::string &value)
{
    ::setenv(name.c_str(), value.c_str(), 1);
}

void replaceEnvironment(const std::vector<std::string> &variables)
{
    ::clearenv();
    for (const auto &variable : variables)
    {
        const auto separator = variable.find('=');
        if (separator != std::string::npos)
            setVariable(variable.substr(0, separator), variable.substr(separator + 1));
    }
}

/// Whether a variable says something about the person, the language or the network.
bool isPersonal(const std::string &variable)
{
    static const char *const beginnings[] = {
        "GIT_",         "XDG_",       "LC_",        "LANG=",       "LANGUAGE=",   "USER=",
        "LOGNAME=",     "EMAIL=",     "SSH_",       "http_proxy=", "HTTP_PROXY=", "https_proxy=",
        "HTTPS_PROXY=", "all_proxy=", "ALL_PROXY=", "EDITOR=",     "VISUAL=",     "SUDO_"};
    for (const char *beginning : beginnings)
    {
        if (startsWith(variable, beginning))
            return true;
    }
    return false;
}

/// Runs `action` if libgit2 runs. Only starting it again returns its start count, which shows that.
template <class Action> void whileLibGit2Runs(Action action)
{
    const bool runs = git_libgit2_init() > 1;
    if (runs)
        action();
    git_libgit2_shutdown();
}

void setSearchPath(git_config_level_t level, const char *folder)
{
    git_libgit2_opts(GIT_OPT_SET_SEARCH_PATH, level, folder);
}

bool isOfTheMachine(std::string_view path)
{
    constexpr std::string_view folder = "/etc/";
    return path.substr(0, folder.size()) == folder;
}

/// The function that reads certificates for libgit2. Goes before mbed TLS's own.
extern "C" __attribute__((visibility("default"))) int
readCertificates(void *chain, const char *path) __asm__("mbedtls_x509_crt_parse_file");

extern "C" int readCertificates(void *chain, const char *path)
{
    // libgit2 reads those of the machine at each start, which takes longer than most tests do.
    if (isOfTheMachine(path))
        return 0;
    static auto *const real = findNext<int(void *, const char *)>("mbedtls_x509_crt_parse_file");
    return real(chain, path);
}

} // namespace

HermeticEnvironment::HermeticEnvironment(const std::filesystem::path &folder)
    : saved_(readEnvironment()), home_(folder / "home"), temporary_(folder / "tmp"),
      system_(folder / "etc")
{
    namespace fs = std::filesystem;
    for (const auto &made : {home_, temporary_, system_, home_ / ".config"})
        fs::create_directories(made);
    fs::permissions(temporary_, fs::perms(01777));

    std::vector<std::string> kept;
    for (const auto &variable : saved_)
    {
        if (!isPersonal(variable))
            kept.push_back(variable);
    }
    replaceEnvironment(kept);
    setVariable("HOME", home_);
    setVariable("XDG_CONFIG_HOME", home_ / ".config");
    setVariable("XDG_CACHE_HOME", home_ / ".cache");
    setVariable("XDG_DATA_HOME", home_ / ".local/share");
    setVariable("XDG_STATE_HOME", home_ / ".local/state");
    setVariable("XDG_RUNTIME_DIR", temporary_);
    setVariable("TMPDIR", temporary_);
    setVariable("LC_ALL", "C.UTF-8");
    setVariable("GIT_CONFIG_NOSYSTEM", "1");
    setVariable("GIT_TERMINAL_PROMPT", "0");
    // A command that wants a message edited takes it as it is.
    setVariable("GIT_EDITOR", "true");
    isolateLibGit2();
}

HermeticEnvironment::~HermeticEnvironment()
{
    replaceEnvironment(saved_);
    whileLibGit2Runs(
        []
        {
            // Null means what libgit2 finds by itself.
            for (const auto level :
                 {GIT_CONFIG_LEVEL_SYSTEM, GIT_CONFIG_LEVEL_XDG, GIT_CONFIG_LEVEL_GLOBAL})
                setSearchPath(level, nullptr);
        });
}

void HermeticEnvironment::isolateLibGit2() const
{
    whileLibGit2Runs(
        [this]
        {
            setSearchPath(GIT_CONFIG_LEVEL_SYSTEM, system_.c_str());
            setSearchPath(GIT_CONFIG_LEVEL_XDG, (home_ / ".config/git").c_str());
            setSearchPath(GIT_CONFIG_LEVEL_GLOBAL, home_.c_str());
        });
}

} // namespace vclink::test
