// SPDX-License-Identifier: MIT
#include "main/toolCommands.hpp"

#include "fl/filesystem/detail/path_text.hpp"
#include "fl/filesystem/operations.hpp"
#include "fl/filesystem/path.hpp"
#include "fl/i18n/convert.hpp"

namespace vclink::git
{

// "%A" appears twice: the tool writes its result there. Intentionally, only this launcher has an
// extension, and only "$LOCAL" has no "$PWD/".
ToolCommand autoMergeDriver()
{
    return {{"merge", "vkAutoMerge", "driver"}, u"vkAutoMerge", u".sh", "%O %A %B %A"};
}

ToolCommand mergeTool()
{
    return {{"mergetool", "vkMerge", "cmd"},
            u"vkMerge",
            u"",
            "$PWD/$BASE $PWD/$LOCAL $PWD/$REMOTE $PWD/$MERGED"};
}

ToolCommand diffTool()
{
    return {{"difftool", "vkDiff", "cmd"}, u"vkDiff", u"", "$LOCAL $PWD/$REMOTE"};
}

std::string configKeyString(const ConfigKey &key)
{
    return key.section + '.' + (key.subsection ? *key.subsection + '.' : std::string()) + key.name;
}

std::string toolLauncherPath(const ToolCommand &tool)
{
    using fl::filesystem::detail::concatenate_pathname;
    const upath root(fl::filesystem::get_install_path());
    ustring path = root.string();
    concatenate_pathname(path, u"bin", root.native());
    concatenate_pathname(path, u"lnxhost", root.native());
    concatenate_pathname(path, tool.launcher, root.native());
    if (!tool.extension.empty())
    {
        fl::filesystem::detail::replace_extension(path, tool.extension);
    }
    return fl::i18n::ustring_to_utf8(fl::filesystem::detail::make_generic_form(path));
}

std::string quotedCommand(const std::string &launcher, const std::string &arguments)
{
    return '"' + launcher + "\" " + arguments;
}

} // namespace vclink::git
