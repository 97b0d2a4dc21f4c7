// SPDX-License-Identifier: MIT
#include "imports.hpp"

#include "differential/quoting.hpp"

namespace vclink::test
{
namespace
{

bool isId(const std::string &content)
{
    return content.size() == 40 &&
           content.find_first_not_of("0123456789abcdef") == std::string::npos;
}

} // namespace

std::string commitOf(const std::string &branch, const Files &files)
{
    std::string stream = "commit refs/heads/" + branch +
                         "\ncommitter A <a@example.com> 1577836800 +0000\n" +
                         asFastImportData(branch);
    if (branch != "main")
        stream += "from refs/heads/main\n";
    for (const auto &[path, content] : files)
        if (content == "-")
            stream += "D \"" + path + "\"\n";
    for (const auto &[path, content] : files)
        if (isId(content))
            stream += "M 160000 " + content + " \"" + path + "\"\n";
        else if (content != "-")
            stream += "M 100644 inline \"" + path + "\"\n" + asFastImportData(content);
    return stream;
}

void importCommits(const GitRepository &copy, const std::string &stream)
{
    copy.git({"config", "core.logAllRefUpdates", "false"});
    copy.command({"-c", "fastimport.unpackLimit=1", "fast-import", "--quiet"})
        .input(stream)
        .runOrThrow();
    copy.git({"pack-refs", "--all"});
    copy.git({"reset", "--quiet", "--hard"});
    copy.write(".git/info/exclude", "");
}

} // namespace vclink::test
