#include "client/panel/PanelRecorder.h"

#include <utility>

#include "client/record/RecordingFile.h"
#include "client/terminal/ClientError.h"

namespace vexa::client {

template <class Work>
void PanelRecorder::orEnd(Work work) {
    if (!m_writer) return;
    try {
        work(*m_writer);
    } catch (const ClientError&) {
        m_writer.reset();
        throw;
    }
}

void PanelRecorder::start() {
    if (m_writer) return;
    m_name = m_recordings.create();
    m_writer = std::make_unique<RecordingWriter>(utf8Path(m_recordings.pathOf(m_name)), false);
}

void PanelRecorder::add(RecordedPort port, const std::string& text) {
    orEnd([&](RecordingWriter& writer) { writer.add(port, text); });
}

void PanelRecorder::flush() {
    orEnd([](RecordingWriter& writer) { writer.flush(); });
}

void PanelRecorder::stop() {
    orEnd([](RecordingWriter& writer) { writer.finish(); });
    m_writer.reset();
}

Json::Value PanelRecorder::state() const {
    Json::Value object(Json::objectValue);
    object["active"] = isActive();
    object["name"] = isActive() ? m_name : "";
    object["events"] = static_cast<Json::UInt64>(isActive() ? m_writer->eventCount() : 0);
    object["elapsed"] = static_cast<Json::Int64>(isActive() ? m_writer->elapsed().count() : 0);
    return object;
}

}  // namespace vexa::client
