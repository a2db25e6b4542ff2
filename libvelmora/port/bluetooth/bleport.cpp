#include "libvelmora/port/bluetooth/bleport.h"

#include "libvelmora/port/bluetooth/blelink.h"
#include "libvelmora/port/bluetooth/blewriter.h"
#include "libvelmora/port/bluetooth/bluetootherror.h"
#include "libvelmora/port/bluetooth/busloop.h"
#include "libvelmora/port/bluetooth/propertychange.h"

#include <asio/buffer.hpp>
#include <asio/generic/seq_packet_protocol.hpp>
#include <asio/post.hpp>

#include <array>
#include <string>
#include <sys/socket.h>
#include <thread>
#include <utility>

namespace velmora {

namespace {

using asio::generic::seq_packet_protocol;

constexpr char const* propertiesInterface = "org.freedesktop.DBus.Properties";
constexpr char const* characteristicFace = "org.bluez.GattCharacteristic1";

class BlePort : public IPort
{
public:
    explicit BlePort(BleLink link)
        : m_link(std::move(link)), m_busLoop(m_context, *m_link.bus, [this] { lose(); }),
          m_writer(m_context, m_link, m_busLoop, [this] { lose(); })
    {
        if (m_link.notifySocket >= 0) {
            m_notify.emplace(m_context, seq_packet_protocol(AF_UNIX, 0), m_link.notifySocket);
        }
        watchDevice();
        if (!m_notify) {
            watchValues();
        }
    }
    ~BlePort() override { BlePort::close(); }
    BlePort(BlePort const&) = delete;
    BlePort& operator=(BlePort const&) = delete;

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
        asio::post(m_context, [this] {
            m_busLoop.pump();
            if (m_notify) {
                read();
            }
        });
        m_thread = std::thread([this] { m_context.run(); });
    }

    void write(std::string_view bytes) override
    {
        asio::post(m_context, [this, text = std::string(bytes)] { m_writer.write(text); });
    }

    void close() override
    {
        asio::post(m_context, [this] { end(); });
        if (m_thread.joinable()) {
            m_thread.join();
            leaveDevice();
        }
    }

private:
    void read()
    {
        m_notify->async_receive(asio::buffer(m_buffer), m_flags,
                                [this](asio::error_code const& error, std::size_t count) {
                                    // The end of such a socket is an empty datagram.
                                    if (error || count == 0) {
                                        lose();
                                        return;
                                    }
                                    m_onBytes(std::string_view(m_buffer.data(), count));
                                    read();
                                });
    }

    void watchDevice()
    {
        m_deviceWatch = watch(m_link.device, [](sd_bus_message* message, void* port, sd_bus_error*) {
            static_cast<BlePort*>(port)->onDeviceChanged(message);
            return 0;
        });
    }

    // The slower way of notifications: each is a signal that tells the characteristic's value.
    void watchValues()
    {
        std::string const& path = m_link.characteristics.notify.path;
        m_valueWatch = watch(path, [](sd_bus_message* message, void* port, sd_bus_error*) {
            static_cast<BlePort*>(port)->onValueChanged(message);
            return 0;
        });
        m_link.bus->call(path, characteristicFace, "StartNotify");
    }

    BusSlot watch(std::string const& path, sd_bus_message_handler_t handler)
    {
        sd_bus_slot* slot = nullptr;
        checked(sd_bus_match_signal(m_link.bus->raw(), &slot, "org.bluez", path.c_str(), propertiesInterface,
                                    "PropertiesChanged", handler, this));
        return BusSlot(slot);
    }

    void onDeviceChanged(sd_bus_message* message)
    {
        if (tellsDisconnected(message)) {
            lose();
        }
    }

    void onValueChanged(sd_bus_message* message)
    {
        std::string const bytes = changedValue(message);
        if (!bytes.empty() && m_onBytes && !m_closed) {
            m_onBytes(bytes);
        }
    }

    void lose()
    {
        if (!m_closed) {
            end();
            if (m_onLost) {
                m_onLost();
            }
        }
    }

    void end()
    {
        m_closed = true;
        m_writer.end();
        m_busLoop.stop();
        asio::error_code ignored;
        if (m_notify) {
            m_notify->close(ignored);
        }
    }

    // Without waiting, so that the adapter is free for the next one. Left alone if somebody else was connected.
    void leaveDevice()
    {
        if (m_link.wasConnected) {
            return;
        }
        BusMessage const request = m_link.bus->makeCall(m_link.device, "org.bluez.Device1", "Disconnect");
        sd_bus_message_set_expect_reply(request.get(), 0);
        sd_bus_send(m_link.bus->raw(), request.get(), nullptr);
        sd_bus_flush(m_link.bus->raw());
    }

    asio::io_context m_context;
    BleLink m_link;
    BusLoop m_busLoop;
    BleWriter m_writer;
    BusSlot m_deviceWatch;
    BusSlot m_valueWatch;
    std::optional<seq_packet_protocol::socket> m_notify;
    Receiver m_onBytes;
    LossHandler m_onLost;
    std::array<char, 1024> m_buffer{};
    asio::socket_base::message_flags m_flags = 0;
    bool m_closed = false;
    std::thread m_thread;
};

} // namespace

std::unique_ptr<IPort> openBlePort(BleAddress const& address, OpeningStop const& stop)
{
    try {
        return std::make_unique<BlePort>(connectBle(address, stop));
    } catch (BusError const& error) {
        throw bluezError("Could not listen to " + address.mac, error.name(), error.what());
    }
}

} // namespace velmora
