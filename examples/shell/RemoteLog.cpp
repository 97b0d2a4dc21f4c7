// SPDX-License-Identifier: MIT
#include "RemoteLog.hpp"

#include <charconv>
#include <string_view>

#include <boost/log/attributes/value_extraction.hpp>
#include <boost/log/core.hpp>
#include <boost/log/sinks/basic_sink_backend.hpp>
#include <boost/log/sinks/sync_frontend.hpp>
#include <boost/make_shared.hpp>

#include "libraryRecords.hpp"
#include "severities.hpp"
#include "vclink_host/logging.hpp"

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

class NotesBackend
    : public boost::log::sinks::basic_sink_backend<boost::log::sinks::synchronized_feeding>
{
  public:
    explicit NotesBackend(RemoteNotes &notes) : notes_(notes)
    {
    }

    void consume(const boost::log::record_view &record)
    {
        if (const auto message = boost::log::extract<std::string>("Message", record))
        {
            takeNote(notes_, message.get());
        }
    }

  private:
    RemoteNotes &notes_;
};

using NotesSink = boost::log::sinks::synchronous_sink<NotesBackend>;

namespace
{

boost::shared_ptr<NotesSink> makeNotesSink(RemoteNotes &notes)
{
    auto sink = boost::make_shared<NotesSink>(boost::make_shared<NotesBackend>(notes));
    sink->set_filter([](const boost::log::attribute_value_set &values)
                     { return isFromLibrary(values, parameterSeverity); });
    return sink;
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

struct RemoteLog::Impl
{
    boost::shared_ptr<NotesSink> sink;
    unsigned severitiesBefore;
};

RemoteLog::RemoteLog(RemoteNotes &notes)
    : impl_(std::make_unique<Impl>(
          Impl{makeNotesSink(notes), vclink_host::getEnabledSeverities(libraryLogger)}))
{
    boost::log::core::get()->add_sink(impl_->sink);
    vclink_host::setEnabledSeverities(libraryLogger, impl_->severitiesBefore | parameterSeverity);
}

RemoteLog::~RemoteLog()
{
    vclink_host::setEnabledSeverities(libraryLogger, impl_->severitiesBefore);
    boost::log::core::get()->remove_sink(impl_->sink);
}

} // namespace vclink::shell
