// SPDX-License-Identifier: MIT
#include "MergeLog.hpp"

#include <charconv>
#include <string_view>

#include "severities.hpp"

namespace vclink::shell
{
namespace
{

/// The NAME of "merge.NAME.driver COMMAND"; empty for other records.
std::string_view driverOf(std::string_view record)
{
    constexpr std::string_view begin = "merge.";
    constexpr std::string_view end = ".driver ";
    const std::size_t place = record.find(end);
    const bool isOne = record.substr(0, begin.size()) == begin && place != std::string_view::npos &&
                       place >= begin.size();
    return isOne ? record.substr(begin.size(), place - begin.size()) : std::string_view();
}

/// The CODE of "Throwing error TEXT (CODE)"; 0 for other records.
int codeOf(std::string_view record)
{
    constexpr std::string_view begin = "Throwing error ";
    const std::size_t place = record.rfind('(');
    int code = 0;
    if (record.substr(0, begin.size()) == begin && place != std::string_view::npos)
    {
        std::from_chars(record.data() + place + 1, record.data() + record.size(), code);
    }
    return code;
}

} // namespace

void takeNote(MergeNotes &notes, const std::string &record)
{
    const std::string_view driver = driverOf(record);
    if (!driver.empty())
    {
        notes.driver = driver;
        notes.command =
            record.substr(record.find(".driver ") + std::string_view(".driver ").size());
    }
    else if (record == "Auto-merge unsuccessful")
    {
        ++notes.refusals[notes.driver];
    }
    else if (const int code = codeOf(record); code != 0)
    {
        notes.failure = code;
    }
}

MergeLog::MergeLog(MergeNotes &notes)
    : reader_(diagnosticSeverity, [&notes](const std::string &record) { takeNote(notes, record); })
{
}

} // namespace vclink::shell
