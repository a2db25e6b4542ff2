#pragma once

#include "libvelmora/port/iport.h"
#include "libvelmora/record/dialoguerecorder.h"

#include <memory>
#include <utility>

namespace velmora {

// Hands what passes a port to a recorder as well, which must outlive it.
class RecordedPort : public IPort
{
public:
    RecordedPort(std::unique_ptr<IPort> port, DialogueRecorder& recorder)
        : m_port(std::move(port)), m_recorder(recorder)
    {}

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_port->start(
            [this, onBytes = std::move(onBytes)](std::string_view bytes) {
                m_recorder.onReceived(bytes);
                onBytes(bytes);
            },
            std::move(onLost));
    }

    void write(std::string_view bytes) override
    {
        m_recorder.onSent(bytes);
        m_port->write(bytes);
    }

    void close() override { m_port->close(); }

private:
    std::unique_ptr<IPort> m_port;
    DialogueRecorder& m_recorder;
};

} // namespace velmora
