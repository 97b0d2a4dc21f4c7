// SPDX-License-Identifier: MIT
#include "RemoteLog.hpp"

#include <charconv>
#include <string_view>

#include "severities.hpp"

namespace vclink::shell
{
namespace
{

/// What follows the first `mark` in a text, which is cut off there; nothing if there is none.
std::optional<std::string_view> splitAt(std::string_view &text, std::string_view mark)
{
    const std::size_t place = text.find(mark);
    if (place == std::string_view::npos)
    {
        return std::nullopt;
    }
    const std::string_view rest = text.substr(place + mark.size());
    text = text.substr(0, place);
    return rest;
}

bool takeFront(std::string_view &text, std::string_view beginning)
{
    const bool begins = text.substr(0, beginning.size()) == beginning;
    text.remove_prefix(begins ? beginning.size() : 0);
    return begins;
}

void noteCredentials(RemoteNotes &notes, std::string_view request)
{
    // An address may hold anything, the number stands at the end.
    const std::size_t digits = request.find_last_of('=') + 1;
    unsigned kinds = 0;
    std::from_chars(request.data() + digits, request.data() + request.size(), kinds);
    notes.credentials = kinds;
}

} // namespace

void takeNote(RemoteNotes &notes, const std::string &record)
{
    std::string_view text = record;
    if (takeFront(text, " url="))
    {
        noteCredentials(notes, text);
    }
    else if (takeFront(text, " ref="))
    {
        ++notes.updated;
    }
    else if (takeFront(text, " refnameStr="))
    {
        const std::string_view status = splitAt(text, " statusStr=").value_or("");
        notes.pushed.push_back({std::string(text), std::string(status)});
    }
}

RemoteLog::RemoteLog(RemoteNotes &notes)
    : reader_(parameterSeverity, [&notes](const std::string &record) { takeNote(notes, record); })
{
}

} // namespace vclink::shell
