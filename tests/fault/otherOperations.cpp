// SPDX-License-Identifier: MIT
#include <optional>

#include "Operation.hpp"
#include "repositories.hpp"
#include "support/text.hpp"
#include "vclink/git/GitAttributes.hpp"
#include "vclink/git/GitConfig.hpp"

namespace vclink::test
{
namespace
{

using git::GitConfig;

template <class Value>
std::string shown(const std::optional<Value> &value, std::string (*text)(const Value &))
{
    return value ? text(*value) : "nothing";
}

Action makeConfig(const Subject & /*subject*/)
{
    return []
    {
        const GitConfig config;
        return std::string();
    };
}

Action globalFilePath(const Subject & /*subject*/)
{
    const auto config = std::make_shared<GitConfig>();
    return [=] { return shown(config->globalFilePath(), asBytes); };
}

std::function<Action(const Subject &)> reading(std::optional<ustring> (GitConfig::*operation)()
                                                   const)
{
    return [=](const Subject & /*subject*/) -> Action
    {
        const auto config = std::make_shared<GitConfig>();
        config->writeAutoMergeDriver();
        config->writeMergeTool();
        config->writeDiffTool();
        return [=] { return shown(((*config).*operation)(), asUtf8); };
    };
}

std::function<Action(const Subject &)> writing(void (GitConfig::*operation)())
{
    return [=](const Subject & /*subject*/) -> Action
    {
        const auto config = std::make_shared<GitConfig>();
        return [=]
        {
            ((*config).*operation)();
            return std::string();
        };
    };
}

Action createAttributes(const Subject &subject)
{
    return [=]
    {
        static_cast<void>(git::GitAttributes::create(*subject.adapter));
        return std::string();
    };
}

Action getAttribute(const Subject &subject)
{
    const std::shared_ptr<git::GitAttributes> attributes =
        git::GitAttributes::create(*subject.adapter);
    return [attributes, adapter = subject.adapter]
    { return serialize(attributes->getAttribute(upath(u"file"), u"colour")); };
}

} // namespace

std::vector<Operation> otherOperations()
{
    return {
        {"GitConfig", makePlain, makeConfig, "", {}, false},
        {"globalFilePath", makePlain, globalFilePath, "", {}, false},
        {"readAutoMergeDriver", makePlain, reading(&GitConfig::readAutoMergeDriver)},
        {"readMergeTool", makePlain, reading(&GitConfig::readMergeTool)},
        {"readDiffTool", makePlain, reading(&GitConfig::readDiffTool)},
        {"writeAutoMergeDriver", makePlain, writing(&GitConfig::writeAutoMergeDriver)},
        {"writeMergeTool", makePlain, writing(&GitConfig::writeMergeTool)},
        {"writeDiffTool", makePlain, writing(&GitConfig::writeDiffTool)},
        {"GitAttributes", makeAttributes, createAttributes, "", {}, false},
        {"getAttribute", makeAttributes, getAttribute, "", {}, false},
    };
}

} // namespace vclink::test
