// SPDX-License-Identifier: MIT
#include "SourceTree.hpp"

#include <algorithm>
#include <fstream>
#include <iterator>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string_view>

namespace vclink::test
{
namespace
{

std::string readFile(const std::filesystem::path &path)
{
    std::ifstream stream(path, std::ios::binary);
    if (!stream)
        throw std::runtime_error("can't read " + path.string());
    return {std::istreambuf_iterator<char>(stream), {}};
}

/// Takes `word` and the white space after it off the beginning of `text`.
bool take(std::string_view &text, std::string_view word)
{
    if (text.substr(0, word.size()) != word)
        return false;
    text.remove_prefix(word.size());
    text.remove_prefix(std::min(text.find_first_not_of(" \t"), text.size()));
    return true;
}

/// What a line includes, or an empty text.
std::string includedName(std::string_view line)
{
    take(line, "");
    if (!take(line, "#") || !take(line, "include") || line.empty())
        return {};
    const char end = line.front() == '<' ? '>' : '"';
    if (line.front() != '<' && line.front() != '"')
        return {};
    return std::string(line.substr(1, line.find(end, 1) - 1));
}

} // namespace

SourceTree readSourceTree(const std::filesystem::path &root,
                          const std::vector<std::string> &folders)
{
    namespace fs = std::filesystem;
    const std::set<fs::path> extensions{".hpp", ".cpp", ".h", ".c"};
    SourceTree tree;
    for (const auto &folder : folders)
    {
        if (!fs::is_directory(root / folder))
            continue;
        for (const auto &entry : fs::recursive_directory_iterator(root / folder))
        {
            if (entry.is_regular_file() && extensions.count(entry.path().extension()) != 0)
                tree.emplace(fs::relative(entry.path(), root).generic_string(),
                             readFile(entry.path()));
        }
    }
    return tree;
}

std::vector<std::string> findIncludes(const std::string &content)
{
    std::vector<std::string> names;
    std::istringstream lines(content);
    for (std::string line; std::getline(lines, line);)
    {
        const auto name = includedName(line);
        if (!name.empty())
            names.push_back(name);
    }
    return names;
}

std::string resolveInclude(const SourceTree &tree, const std::string &file, const std::string &name)
{
    namespace fs = std::filesystem;
    // The file's own folder, then the folders that the build looks in.
    for (const fs::path &folder :
         {fs::path(file).parent_path(), fs::path(), fs::path("include"), fs::path("host/include"),
          fs::path("host/src"), fs::path("tests")})
    {
        auto candidate = (folder / name).lexically_normal().generic_string();
        if (tree.count(candidate) != 0)
            return candidate;
    }
    return {};
}

std::string layerOf(const std::string &file)
{
    return file.substr(0, file.find('/'));
}

bool isHeader(const std::string &file)
{
    const std::filesystem::path extension = std::filesystem::path(file).extension();
    return extension == ".hpp" || extension == ".h";
}

} // namespace vclink::test
