// SPDX-License-Identifier: MIT
#include "AdapterFixture.hpp"

#include <array>
#include <typeinfo>

#include <gtest/gtest.h>

#include "error/errorUtil/callbackException.hpp"
#include "support/Descriptors.hpp"
#include "support/text.hpp"
#include "vclink/util/exception/CancelledOperationException.hpp"

namespace vclink::test
{

std::string nameOf(FileState state)
{
    static const std::array<const char *, 8> names{"Unversioned", "Clean", "Unknown", "InConflict",
                                                   "Modified",    "Added", "Deleted", "Missing"};
    return names.at(static_cast<std::size_t>(state.getState()));
}

States statesBelow(const std::string &root, const FileStateMap &states)
{
    const std::string beginning = root + '/';
    States below;
    for (const auto &[path, state] : states)
    {
        const std::string name = asBytes(path);
        const bool isBelow = name.compare(0, beginning.size(), beginning) == 0;
        below.emplace(isBelow ? name.substr(beginning.size()) : name, nameOf(state));
    }
    return below;
}

void expectCancelled(const std::function<void()> &action)
{
    const NoDescriptorLeak noLeak;
    try
    {
        action();
        ADD_FAILURE() << "nothing was raised";
    }
    catch (const std::exception &exception)
    {
        EXPECT_EQ(typeid(exception), typeid(vclink::util::exception::CancelledOperationException))
            << exception.what();
    }
    EXPECT_EQ(git::pendingCallbackException(), nullptr);
}

std::unique_ptr<git::GitAdapter> AdapterFixture::makeAdapter(const std::string &root) const
{
    return std::make_unique<git::GitAdapter>(
        asPath(root), std::static_pointer_cast<ApplicationInteractor>(interactor_));
}

States AdapterFixture::allStates(const GitRepository &repository) const
{
    return folderStates(repository, "");
}

States AdapterFixture::states(const GitRepository &repository,
                              const std::vector<std::string> &names) const
{
    const std::string root = repository.path().string();
    std::vector<upath> files;
    for (const auto &name : names)
        files.push_back(asPath(root + '/' + name));
    return statesBelow(root, makeAdapter(root)->getFileStates(files));
}

States AdapterFixture::folderStates(const GitRepository &repository, const std::string &name) const
{
    const std::string root = repository.path().string();
    const std::string folder = name.empty() ? root : root + '/' + name;
    return statesBelow(root, makeAdapter(root)->getFolderStates(asPath(folder)));
}

} // namespace vclink::test
