// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "resource_core/BaseMsgID.hpp"

namespace vclink_host_tests
{

inline const std::string catalogue = "shared_vclink:git";

/// Every message of the catalogue, with arguments of the types that the back end gives.
inline std::vector<resource_core::BaseMsgID> makeAllMessages()
{
    using resource_core::BaseMsgID;
    return {
        BaseMsgID({-17L, 42L, ustring(u"no such thing")}, catalogue, "LibGit2Error"),
        BaseMsgID({std::string("topic")}, catalogue, "MergeFailed"),
        BaseMsgID({}, catalogue, "HasConflicts"),
        BaseMsgID({}, catalogue, "UnableToMergeBadRepositoryState"),
        BaseMsgID({}, catalogue, "MergePreferenceFastForward"),
        BaseMsgID({ustring(u"/one\n/two")}, catalogue, "AlreadyAdded"),
        BaseMsgID({}, catalogue, "NoFilesToRemove"),
        BaseMsgID({ustring(u"/one\n/two")}, catalogue, "Conflicted"),
        BaseMsgID({}, catalogue, "NoUserName"),
        BaseMsgID({std::string("odd value")}, catalogue, "InvalidGitAttributeValue"),
        BaseMsgID({ustring(u"dir/file")}, catalogue, "ProgressCallbackCheckoutMessage"),
    };
}

} // namespace vclink_host_tests
