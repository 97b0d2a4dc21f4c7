// SPDX-License-Identifier: MIT
#include "RemoteLog.hpp"

#include <algorithm>
#include <charconv>
#include <iterator>
#include <string_view>
#include <utility>

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

bool hasPassword(std::string_view address)
{
    std::string_view user = splitAt(address, "://").value_or("");
    user = user.substr(0, user.find('/'));
    user = user.substr(0, user.find_last_of('@') + 1);
    return user.find(':') != std::string_view::npos;
}

void noteCredentials(RemoteNotes &notes, std::string_view request)
{
    notes.hasPassword = hasPassword(request.substr(0, request.rfind(" username_from_url=")));
    // An address can contain anything; the number is at the end.
    const std::size_t digits = request.find_last_of('=') + 1;
    unsigned kinds = 0;
    std::from_chars(request.data() + digits, request.data() + request.size(), kinds);
    notes.credentials = kinds;
}

/// What git's servers say of their progress.
bool reportsProgress(std::string_view line)
{
    constexpr std::string_view beginnings[] = {
        "Enumerating objects:", "Counting objects:",  "Compressing objects:", "Total ",
        "Resolving deltas:",    "Unpacking objects:", "Checking connectivity"};
    return std::any_of(std::begin(beginnings), std::end(beginnings),
                       [line](std::string_view beginning)
                       { return line.substr(0, beginning.size()) == beginning; });
}

void hearLine(RemoteNotes &notes, bool isDrawnAgain)
{
    std::string line = std::exchange(notes.unfinished, {});
    line.erase(line.find_last_not_of(" \t") + 1);
    const bool isProgress = isDrawnAgain || reportsProgress(line);
    if (line.empty())
    {
        return;
    }
    if (!isProgress)
    {
        notes.words.push_back(line);
    }
    if (notes.hear)
    {
        notes.hear(line, isProgress);
    }
}

void hearServer(RemoteNotes &notes, std::string_view text)
{
    for (const char letter : text)
    {
        if (letter == '\n' || letter == '\r')
        {
            hearLine(notes, letter == '\r');
        }
        else
        {
            notes.unfinished += letter;
        }
    }
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
    else if (takeFront(text, " msgStr="))
    {
        hearServer(notes, text);
    }
}

RemoteLog::RemoteLog(RemoteNotes &notes)
    : notes_(notes),
      reader_(parameterSeverity, [&notes](const std::string &record) { takeNote(notes, record); })
{
}

RemoteLog::~RemoteLog()
{
    hearLine(notes_, false);
}

} // namespace vclink::shell
