// SPDX-License-Identifier: MIT
#include "Operation.hpp"

#include <exception>
#include <typeinfo>

#include <boost/core/demangle.hpp>

#include "foundation/core/except/IMsgIDException.hpp"
#include "support/text.hpp"
#include "vclink/git/GitException.hpp"
#include "vclink/git/LibGit2Exception.hpp"
#include "vclink/git/messageIdentifiers.hpp"

namespace vclink::test
{
namespace
{

template <class List> void append(std::vector<Operation> &operations, const List &more)
{
    operations.insert(operations.end(), more.begin(), more.end());
}

template <class Exception> std::string typeOf(const Exception &exception)
{
    return boost::core::demangle(typeid(exception).name());
}

} // namespace

upath Subject::pathOf(const std::string &name) const
{
    return asPath(repository / name);
}

std::vector<upath> Subject::pathsOf(const std::vector<std::string> &names) const
{
    std::vector<upath> paths;
    for (const auto &name : names)
        paths.push_back(pathOf(name));
    return paths;
}

std::ostream &operator<<(std::ostream &stream, const Operation &operation)
{
    return stream << operation.name;
}

const std::vector<Operation> &allOperations()
{
    static const std::vector<Operation> operations = []
    {
        std::vector<Operation> all = adapterOperations();
        append(all, branchOperations());
        append(all, remoteOperations());
        append(all, otherOperations());
        return all;
    }();
    return operations;
}

std::string outcomeOf(const Action &action)
{
    try
    {
        return "done: " + action();
    }
    catch (const git::LibGit2Exception &exception)
    {
        const git::GitError &error = exception.getError();
        return typeOf(exception) + ' ' + std::to_string(error.getCode()) + ", class " +
               std::to_string(error.getErrorClass()) + ": " + asUtf8(error.getMessage());
    }
    catch (const foundation::core::except::IMsgIDException &exception)
    {
        return typeOf(exception) + ": " + asUtf8(exception.GetUnicodeMessageTxt());
    }
    catch (const std::exception &exception)
    {
        return typeOf(exception) + ": " + exception.what();
    }
}

std::string failure(int code, int errorClass, const std::string &text)
{
    return "vclink::git::LibGit2Exception " + std::to_string(code) + ", class " +
           std::to_string(errorClass) + ": " + text;
}

std::string mergeFailure(const std::string &addedText)
{
    const git::GitException exception(shared_vclink::git::MergeFailed(std::string("topic")),
                                      asUtf16(addedText));
    return "vclink::git::GitException: " + asUtf8(exception.GetUnicodeMessageTxt());
}

} // namespace vclink::test
