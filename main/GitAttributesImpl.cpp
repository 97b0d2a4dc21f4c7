// SPDX-License-Identifier: MIT
#include "main/GitAttributesImpl.hpp"

#include <string>

#include <git2/attr.h>

#include "error/errorUtil/GitResult.hpp"
#include "error/errorUtil/gitString.hpp"
#include "fl/i18n/convert.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::git
{
namespace
{

using State = decltype(GitAttribute::attributeValue);

/// @param value the result of git_attr_get
State classify(const char *value)
{
    switch (git_attr_value(value))
    {
    case GIT_ATTR_VALUE_UNSPECIFIED:
        return GitAttribute::Unspecified();
    case GIT_ATTR_VALUE_TRUE:
        return GitAttribute::Set();
    case GIT_ATTR_VALUE_FALSE:
        return GitAttribute::Unset();
    case GIT_ATTR_VALUE_STRING:
        return GitAttribute::Value{fl::i18n::utf8_to_ustring(value)};
    }
    throw GitException(shared_vclink::git::InvalidGitAttributeValue(value));
}

} // namespace

GitAttributesImpl::GitAttributesImpl(GitAdapter &adapter) : adapter_(adapter)
{
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    // Intentionally ignored: no query depends on it.
    static_cast<void>(call(git_attr_cache_flush, repository.get()));
}

GitAttributesImpl::~GitAttributesImpl() = default;

GitAttribute GitAttributesImpl::getAttribute(const upath &path, const ustring &name)
{
    const std::string file = toGitString(path.string());
    const std::string attribute = toGitString(name);
    const OwnedHandle<git_repository> repository = adapter_.getRepository();
    const char *value = nullptr;
    check(git_attr_get, &value, repository.get(), unsigned{GIT_ATTR_CHECK_FILE_THEN_INDEX},
          file.c_str(), attribute.c_str());
    return {name, classify(value)};
}

GitAttributes::~GitAttributes() = default;

std::unique_ptr<GitAttributes> GitAttributes::create(vclink::CMAdapter &adapter)
{
    return std::make_unique<GitAttributesImpl>(dynamic_cast<GitAdapter &>(adapter));
}

} // namespace vclink::git
