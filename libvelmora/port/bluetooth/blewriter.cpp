#include "libvelmora/port/bluetooth/blewriter.h"

#include <asio/buffer.hpp>
#include <asio/post.hpp>

#include <sys/socket.h>
#include <utility>

namespace velmora {

namespace {

// Pieces that come within one connection event cost some adapters bytes.
constexpr std::chrono::milliseconds betweenPieces{15};

} // namespace

BleWriter::BleWriter(asio::io_context& context, BleLink& link, BusLoop& busLoop, std::function<void()> onFailed)
    : m_context(context), m_link(link), m_busLoop(busLoop), m_onFailed(std::move(onFailed)), m_pause(context)
{
    if (m_link.writeSocket >= 0) {
        m_socket.emplace(m_context, asio::generic::seq_packet_protocol(AF_UNIX, 0), m_link.writeSocket);
    }
}

void BleWriter::write(std::string_view bytes)
{
    m_outgoing += bytes;
    writeNext();
}

void BleWriter::end()
{
    m_ended = true;
    m_pause.cancel();
    if (m_socket) {
        asio::error_code ignored;
        m_socket->close(ignored);
    }
}

void BleWriter::writeNext()
{
    if (m_writing || m_outgoing.empty() || m_ended) {
        return;
    }
    m_writing = true;
    m_piece = m_outgoing.substr(0, m_link.piece);
    m_outgoing.erase(0, m_piece.size());
    if (m_socket) {
        m_socket->async_send(asio::buffer(m_piece), 0,
                             [this](asio::error_code const& error, std::size_t) { onWritten(!error); });
        return;
    }
    try {
        writeValue();
    } catch (BusError const&) {
        m_onFailed();
    }
}

void BleWriter::writeValue()
{
    BusMessage const request =
        m_link.bus->makeCall(m_link.characteristics.write.path, "org.bluez.GattCharacteristic1", "WriteValue");
    checked(sd_bus_message_append_array(request.get(), 'y', m_piece.data(), m_piece.size()));
    checked(sd_bus_message_append(request.get(), "a{sv}", 1, "type", "s", "request"));
    auto const answered = [](sd_bus_message* answer, void* writer, sd_bus_error*) {
        static_cast<BleWriter*>(writer)->onWritten(sd_bus_message_is_method_error(answer, nullptr) == 0);
        return 0;
    };
    sd_bus_slot* slot = nullptr;
    checked(sd_bus_call_async(m_link.bus->raw(), &slot, request.get(), answered, this, 0));
    m_call.reset(slot);
    asio::post(m_context, [this] { m_busLoop.pump(); });
}

void BleWriter::onWritten(bool good)
{
    if (!good) {
        m_onFailed();
    } else if (m_outgoing.empty()) {
        m_writing = false;
    } else {
        m_pause.expires_after(betweenPieces);
        m_pause.async_wait([this](asio::error_code const& error) {
            m_writing = false;
            if (!error) {
                writeNext();
            }
        });
    }
}

} // namespace velmora
