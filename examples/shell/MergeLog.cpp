// SPDX-License-Identifier: MIT
#include "MergeLog.hpp"

#include <string_view>

#include "severities.hpp"

namespace vclink::shell
{
namespace
{

/// Of "merge.NAME.driver COMMAND" the name; empty for other records.
std::string_view driverOf(std::string_view record)
{
    constexpr std::string_view begin = "merge.";
    constexpr std::string_view end = ".driver ";
    const std::size_t place = record.find(end);
    const bool isOne = record.substr(0, begin.size()) == begin && place != std::string_view::npos &&
                       place >= begin.size();
    return isOne ? record.substr(begin.size(), place - begin.size()) : std::string_view();
}

} // namespace

void takeNote(MergeNotes &notes, const std::string &record)
{
    const std::string_view driver = driverOf(record);
    if (!driver.empty())
    {
        notes.driver = driver;
    }
    else if (record == "Auto-merge unsuccessful")
    {
        ++notes.refusals[notes.driver];
    }
}

MergeLog::MergeLog(MergeNotes &notes)
    : reader_(diagnosticSeverity, [&notes](const std::string &record) { takeNote(notes, record); })
{
}

} // namespace vclink::shell
