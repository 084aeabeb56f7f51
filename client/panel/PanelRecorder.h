#pragma once

#include <json/value.h>

#include <memory>
#include <string>

#include "client/panel/web/PanelRecordings.h"
#include "client/record/RecordingWriter.h"

namespace vexa::client {

/// The recording that a page has begun, if there is one. Whatever can't be written throws ClientError, and
/// ends it.
class PanelRecorder {
public:
    explicit PanelRecorder(const PanelRecordings& recordings) : m_recordings(recordings) {}

    bool isActive() const { return m_writer != nullptr; }

    void start();
    void add(RecordedPort port, const std::string& text);
    void flush();
    void stop();

    /// As pages are told it.
    Json::Value state() const;

private:
    template <class Work>
    void orEnd(Work work);

    const PanelRecordings& m_recordings;
    std::string m_name;
    std::unique_ptr<RecordingWriter> m_writer;
};

}  // namespace vexa::client
