// SPDX-License-Identifier: MIT
#include "vclink/git/GitConfig.hpp"

#include <string>

#include <git2/buffer.h>
#include <git2/config.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "error/errorUtil/libgit2Release.hpp"
#include "fl/i18n/convert.hpp"
#include "main/toolCommands.hpp"
#include "scl/core/memory/make_unique_incomplete.hpp"
#include "util/scope/KeptMode.hpp"
#include "vclink/git/LibGit2Guard.hpp"

namespace vclink::git
{
namespace
{

/// If a file can no longer be read or parsed, a look-up frees an entry that it has not found, which
/// ends the process.
constexpr bool endsAtBrokenFiles = isLibGit2Since(1, 9);

/// A buffer that libgit2 fills.
class Buffer
{
  public:
    Buffer() = default;
    Buffer(const Buffer &) = delete;
    Buffer &operator=(const Buffer &) = delete;
    ~Buffer()
    {
        git_buf_dispose(&buffer_);
    }

    git_buf *get() noexcept
    {
        return &buffer_;
    }
    std::string bytes() const
    {
        return std::string(buffer_.ptr, buffer_.size);
    }
    ustring text() const
    {
        return fl::i18n::utf8_to_ustring(bytes());
    }

  private:
    git_buf buffer_ = {};
};

/// Intentionally treats a failure as no value.
std::optional<ustring> readText(git_config *config, const std::string &key)
{
    Buffer value;
    if (git_config_get_string_buf(value.get(), config, key.c_str()) != 0)
    {
        return std::nullopt;
    }
    return value.text();
}

std::optional<ustring> read(git_config *config, const ConfigKey &key)
{
    if constexpr (endsAtBrokenFiles)
    {
        // A snapshot reads the files itself, and reports a failure.
        const auto snapshot = acquire<git_config>(git_config_snapshot, config);
        return snapshot.has_error() ? std::nullopt
                                    : readText(snapshot.value().get(), configKeyString(key));
    }
    else
    {
        return readText(config, configKeyString(key));
    }
}

/// Returns an empty path if the file does not exist.
std::string pathFrom(int (*find)(git_buf *))
{
    Buffer path;
    return call(find, path.get()).has_value() ? path.bytes() : std::string();
}

OwnedHandle<git_config> openDefault()
{
    return acquire<git_config>(git_config_open_default).value();
}

OwnedHandle<git_config> openGlobal(git_config *all)
{
    return acquire<git_config>(git_config_open_global, all).value();
}

/// Sets a value. libgit2 does nothing if the handle has read the same value before, whatever is in
/// the file now.
/// @param isMissing whether there is no file
void setValue(git_config *config, bool isMissing, const char *key, const char *value)
{
    if (isMissing)
    {
        // A handle keeps what it has read of a file that is gone.
        const OwnedHandle<git_config> all = openDefault();
        check(git_config_set_string, openGlobal(all.get()).get(), key, value);
        return;
    }
    // Makes the handle read the file again if it has changed. If that fails, the write decides.
    static_cast<void>(acquire<git_config>(git_config_snapshot, config));
    check(git_config_set_string, config, key, value);
}

void write(git_config *config, const ToolCommand &tool)
{
    // libgit2 writes one of the two.
    const std::string xdg = pathFrom(git_config_find_xdg);
    const std::string global = pathFrom(git_config_find_global);
    const KeptMode inXdgFolder(xdg);
    const KeptMode inHome(global);
    const std::string key = configKeyString(tool.key);
    const std::string value = quotedCommand(toolLauncherPath(tool), tool.arguments);
    setValue(config, xdg.empty() && global.empty(), asGitString(key), asGitString(value));
}

} // namespace

struct GitConfig::Impl
{
    LibGit2Guard guard;
    OwnedHandle<git_config> defaultConfig = openDefault();
    OwnedHandle<git_config> globalConfig = openGlobal(defaultConfig.get());
};

GitConfig::GitConfig() : impl_(scl::core::memory::make_unique_incomplete<Impl, Impl>())
{
}

GitConfig::~GitConfig() = default;

std::optional<upath> GitConfig::globalFilePath() const
{
    Buffer path;
    if (git_config_find_global(path.get()) != 0)
    {
        return std::nullopt;
    }
    return upath(path.text());
}

std::optional<ustring> GitConfig::readAutoMergeDriver() const
{
    return read(impl_->globalConfig.get(), autoMergeDriver().key);
}

std::optional<ustring> GitConfig::readMergeTool() const
{
    return read(impl_->globalConfig.get(), mergeTool().key);
}

std::optional<ustring> GitConfig::readDiffTool() const
{
    return read(impl_->globalConfig.get(), diffTool().key);
}

void GitConfig::writeAutoMergeDriver()
{
    write(impl_->globalConfig.get(), autoMergeDriver());
}

void GitConfig::writeMergeTool()
{
    write(impl_->globalConfig.get(), mergeTool());
}

void GitConfig::writeDiffTool()
{
    write(impl_->globalConfig.get(), diffTool());
}

} // namespace vclink::git
