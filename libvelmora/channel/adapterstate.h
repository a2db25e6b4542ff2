#pragma once

#include "libvelmora/channel/busline.h"
#include "libvelmora/channel/elmcommand.h"

#include <string>
#include <utility>
#include <vector>

namespace velmora {

// How the adapter stands, read from the commands that it has confirmed: what is needed to read its replies, and to set
// it up again after it has lost its settings.
class AdapterState
{
public:
    // A command and its reply, lines with their ends.
    void observe(ElmCommand const& command, std::string const& reply);

    bool echoOff() const { return m_echoOff; }
    // The bus whose frames are shown; Unknown while they are not.
    BusKind shownBus() const { return m_headers ? busKindOf(m_protocol) : BusKind::Unknown; }
    int protocol() const { return m_protocol; }
    void setProtocol(int protocol) { m_protocol = protocol; }
    bool headersOn() const { return m_headers; }
    // What the adapter calls itself, blanks removed.
    std::string const& identity() const { return m_identity; }

    // The last command that changed a setting, such as ATST64 for ATST; empty if none did.
    std::string setting(std::string const& word) const;
    // The commands that bring the adapter back to where it stands, in their order.
    std::vector<std::string> setUp() const;

private:
    bool m_echoOff = false;
    bool m_headers = false;
    int m_protocol = 0;
    std::string m_identity;
    std::vector<std::pair<std::string, std::string>> m_settings; // by word, in the order of their first use
};

} // namespace velmora
