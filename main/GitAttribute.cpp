// SPDX-License-Identifier: MIT
#include "vclink/git/GitAttribute.hpp"

#include "fl/i18n/convert.hpp"

namespace vclink::git
{
namespace
{

/// Writes an attribute as text, with its name.
class Words
{
  public:
    explicit Words(const ustring &name) : name_(name)
    {
    }

    ustring operator()(const GitAttribute::Set & /*state*/) const
    {
        return name_;
    }
    ustring operator()(const GitAttribute::Unset & /*state*/) const
    {
        return u"-" + name_;
    }
    ustring operator()(const GitAttribute::Value &state) const
    {
        return name_ + u"=" + state.value;
    }
    ustring operator()(const GitAttribute::Unspecified & /*state*/) const
    {
        return u"!" + name_;
    }

  private:
    const ustring &name_;
};

} // namespace

bool operator==(const GitAttribute &left, const GitAttribute &right)
{
    if (left.name != right.name || left.attributeValue.index() != right.attributeValue.index())
    {
        return false;
    }
    const auto *const value = std::get_if<GitAttribute::Value>(&left.attributeValue);
    return value == nullptr ||
           value->value == std::get<GitAttribute::Value>(right.attributeValue).value;
}

bool operator!=(const GitAttribute &left, const GitAttribute &right)
{
    return !(left == right);
}

std::string serialize(const GitAttribute &attribute)
{
    return fl::i18n::ustring_to_utf8(std::visit(Words(attribute.name), attribute.attributeValue));
}

} // namespace vclink::git
