// SPDX-License-Identifier: MIT
// An attribute in words, against the words joined plainly and against what is read back of them
// from an attribute file. Input: a character for the state, the name up to a line's end, the value.
#include <fstream>
#include <memory>

#include <git2.h>

#include "check.hpp"
#include "error/errorUtil/OwnedHandle.hpp"
#include "fl/i18n/convert.hpp"
#include "main/files/GitAdapter.hpp"
#include "support/HermeticEnvironment.hpp"
#include "support/TemporaryFolder.hpp"
#include "support/TestInteractor.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttributes.hpp"

using vclink::fuzz::require;
using vclink::git::GitAttribute;

namespace
{

/// A working copy with nothing but an attribute file.
class WorkingCopy
{
  public:
    WorkingCopy()
    {
        git_repository *made = nullptr;
        require(git_repository_init(&made, root().c_str(), 0) == 0, "a repository is made");
        const vclink::git::OwnedHandle<git_repository> repository(made);
        environment_.isolateLibGit2();
        attributes_ = vclink::git::GitAttributes::create(adapter_);
    }

    GitAttribute readBack(const std::string &line, const ustring &name)
    {
        std::ofstream(root() / ".gitattributes", std::ios::binary) << line << '\n';
        return attributes_->getAttribute(upath(u"file"), name);
    }

  private:
    std::filesystem::path root() const
    {
        return folder_ / "repository";
    }

    vclink::test::TemporaryFolder folder_;
    vclink::test::HermeticEnvironment environment_{folder_.path()};
    vclink::git::GitAdapter adapter_{vclink::test::asPath(root()),
                                     std::make_shared<vclink::test::TestInteractor>()};
    std::unique_ptr<vclink::git::GitAttributes> attributes_;
};

GitAttribute makeAttribute(char state, const ustring &name, const ustring &value)
{
    switch (state)
    {
    case '+':
        return {name, GitAttribute::Set()};
    case '-':
        return {name, GitAttribute::Unset()};
    case '=':
        return {name, GitAttribute::Value{value}};
    default:
        return {name, GitAttribute::Unspecified()};
    }
}

std::string join(char state, const std::string &name, const std::string &value)
{
    switch (state)
    {
    case '+':
        return name;
    case '-':
        return '-' + name;
    case '=':
        return name + '=' + value;
    default:
        return '!' + name;
    }
}

/// Whether Git takes it for the name of an attribute.
bool isAttributeName(const std::string &name)
{
    const char *const characters =
        "-._0123456789ABCDEFGHIJKLMNOPQRSTUVWXYZabcdefghijklmnopqrstuvwxyz";
    return !name.empty() && name.front() != '-' &&
           name.find_first_not_of(characters) == std::string::npos;
}

/// Returns true if a value can be in a line. libgit2 treats an empty one as none.
bool isAttributeValue(const std::string &value)
{
    return !value.empty() &&
           value.find_first_of(std::string(" \t\n\v\f\r\0", 7)) == std::string::npos;
}

void checkComparison(const GitAttribute &attribute, const GitAttribute &other, bool isSame)
{
    require((attribute == other) == isSame, "attributes are the same when all of them is");
    require((attribute != other) != isSame, "attributes differ when they are not the same");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t *data, std::size_t size)
{
    static WorkingCopy workingCopy;
    if (size == 0)
        return -1;
    const char state = static_cast<char>(*data);
    const auto pieces = vclink::fuzz::cut(vclink::fuzz::bytesOf(data + 1, size - 1), '\n', 2);
    const std::string &name = pieces[0];
    const std::string &value = pieces[1];
    const ustring wideName = fl::i18n::utf8_to_ustring(name);
    const ustring wideValue = fl::i18n::utf8_to_ustring(value);

    const GitAttribute attribute = makeAttribute(state, wideName, wideValue);
    const std::string words = serialize(attribute);
    require(words == join(state, name, value), "an attribute is put into words");
    if (isAttributeName(name) && (state != '=' || isAttributeValue(value)))
        require(workingCopy.readBack("file " + words, wideName) == attribute,
                "an attribute in words is read back as it was");

    checkComparison(attribute, makeAttribute(state, wideName, wideValue), true);
    checkComparison(attribute, makeAttribute(state, wideName + u'x', wideValue), false);
    checkComparison(attribute, makeAttribute(state, wideName, wideValue + u'x'), state != '=');
    checkComparison(attribute, makeAttribute(state == '-' ? '+' : '-', wideName, wideValue), false);
    return 0;
}
