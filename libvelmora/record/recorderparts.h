#pragma once

#include "libvelmora/record/dialoguefile.h"
#include "libvelmora/record/dialoguerecorder.h"

#include <mutex>
#include <optional>
#include <string>

namespace velmora {

// What a Recorder of the face stands on. Any thread, but for the file.
class RecorderParts
{
public:
    explicit RecorderParts(std::string const& path) : file(path) {}

    // A connection begins, and what passes its port is recorded.
    void opening()
    {
        std::lock_guard const lock(m_mutex);
        m_closed.reset();
    }

    // The connection is about to be closed, which is no part of the recording. adapter as it names itself.
    void closing(std::string const& adapter)
    {
        obdsim::Dialogue told = recorder.dialogue();
        told.adapter = adapter;
        std::lock_guard const lock(m_mutex);
        m_closed = std::move(told);
    }

    obdsim::Dialogue dialogue() const
    {
        std::lock_guard const lock(m_mutex);
        return m_closed ? *m_closed : recorder.dialogue();
    }

    DialogueFile file;
    DialogueRecorder recorder;

private:
    mutable std::mutex m_mutex;
    std::optional<obdsim::Dialogue> m_closed; // protected by m_mutex
};

} // namespace velmora
