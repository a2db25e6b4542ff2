#pragma once

#include "libvelmora/port/bluetooth/blelink.h"
#include "libvelmora/port/bluetooth/busloop.h"

#include <asio/generic/seq_packet_protocol.hpp>
#include <asio/io_context.hpp>
#include <asio/steady_timer.hpp>

#include <functional>
#include <optional>
#include <string>
#include <string_view>

namespace velmora {

// Sends bytes to a connected adapter in pieces that it takes, one at a time, by its socket or by messages. Used on the
// context's thread alone.
class BleWriter
{
public:
    // All must outlive this. onFailed is called for a piece that could not be sent.
    BleWriter(asio::io_context& context, BleLink& link, BusLoop& busLoop, std::function<void()> onFailed);

    void write(std::string_view bytes);
    // Nothing is sent from now on.
    void end();

private:
    void writeNext();
    void writeValue();
    void onWritten(bool good);

    asio::io_context& m_context;
    BleLink& m_link;
    BusLoop& m_busLoop;
    std::function<void()> m_onFailed;
    BusSlot m_call;
    std::optional<asio::generic::seq_packet_protocol::socket> m_socket;
    asio::steady_timer m_pause;
    std::string m_outgoing;
    std::string m_piece;
    bool m_writing = false;
    bool m_ended = false;
};

} // namespace velmora
