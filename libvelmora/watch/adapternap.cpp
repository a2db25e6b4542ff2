#include "libvelmora/watch/adapternap.h"

#include <velmora/error.h>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds clearTime{300};

} // namespace

AdapterNap::AdapterNap(Open open, std::chrono::milliseconds limit) : m_open(std::move(open)), m_limit(limit)
{
    reopen();
    // Ends what another program left on the line.
    m_port->write("\r");
    m_inbox->takeUntilPrompt(std::chrono::steady_clock::now() + std::min(limit, clearTime));
    m_sleeps = command("STSLEEP\r") || command("ATLP\r");
    if (m_sleeps) {
        m_inbox->clear();
    }
}

AdapterNap::~AdapterNap()
{
    if (m_port != nullptr) {
        m_port->close();
    }
}

void AdapterNap::reopen()
{
    m_inbox = std::make_shared<PortInbox>();
    m_port = m_open();
    m_port->start([inbox = m_inbox](std::string_view bytes) { inbox->add(bytes); },
                  [inbox = m_inbox] { inbox->lose(); });
}

bool AdapterNap::command(std::string const& text)
{
    m_port->write(text);
    return m_inbox->takeUntilPrompt(std::chrono::steady_clock::now() + m_limit).find("OK") != std::string::npos;
}

// A wireless link goes with the adapter's sleep, and that it can be opened again is the sign.
bool AdapterNap::isOver()
{
    if (m_port == nullptr) {
        try {
            reopen();
        } catch (Error const&) {
            m_port.reset();
            return false;
        }
        return true;
    }
    if (m_inbox->isLost()) {
        m_port->close();
        m_port.reset();
        return false;
    }
    return m_inbox->hasText();
}

} // namespace velmora
