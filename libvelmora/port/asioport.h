#pragma once

#include "libvelmora/port/iport.h"

#include <asio/buffer.hpp>
#include <asio/io_context.hpp>
#include <asio/post.hpp>
#include <asio/serial_port.hpp>
#include <asio/write.hpp>

#include <array>
#include <cstddef>
#include <memory>
#include <mutex>
#include <string>
#include <sys/ioctl.h>
#include <sys/socket.h>
#include <sys/types.h>
#include <thread>
#include <type_traits>
#include <unistd.h>
#include <utility>

namespace velmora {

template <typename Stream>
constexpr bool isSerial = std::is_same_v<Stream, asio::serial_port>;

// The system takes a line for this program alone until it is closed everywhere; behind a pseudo-terminal its own
// program keeps it open.
inline void leaveToOthers(asio::serial_port& line)
{
    ::ioctl(line.native_handle(), TIOCNXCL);
}

// What the system takes at once of these bytes. Any fault is left to who writes the rest.
template <typename Stream>
std::size_t writeAtOnce(Stream& stream, std::string_view bytes)
{
    ssize_t taken = 0;
    if constexpr (isSerial<Stream>) {
        taken = ::write(stream.native_handle(), bytes.data(), bytes.size()); // Asio's lines never block
    } else {
        taken = ::send(stream.native_handle(), bytes.data(), bytes.size(), MSG_NOSIGNAL | MSG_DONTWAIT);
    }
    return taken > 0 ? static_cast<std::size_t>(taken) : 0;
}

// A port over an Asio stream: a socket or a serial line. Its thread reads. A request is written by who sends it, as far
// as the system takes it at once, since waking the port's thread for it would cost more than the write; the rest and
// all that follows go out on that thread.
template <typename Stream>
class AsioPort : public IPort
{
public:
    // context must be that of the open stream.
    AsioPort(std::unique_ptr<asio::io_context> context, Stream stream)
        : m_context(std::move(context)), m_stream(std::move(stream))
    {}
    ~AsioPort() override { AsioPort::close(); }
    AsioPort(AsioPort const&) = delete;
    AsioPort& operator=(AsioPort const&) = delete;

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
        read();
        m_thread = std::thread([this] { m_context->run(); });
    }

    void write(std::string_view bytes) override
    {
        std::lock_guard const lock(m_mutex);
        if (m_closed) {
            return;
        }
        bool const idle = !m_writing && m_outgoing.empty();
        bytes.remove_prefix(idle ? writeAtOnce(m_stream, bytes) : 0);
        if (!bytes.empty()) {
            m_outgoing += bytes;
            asio::post(*m_context, [this] { writeNext(); });
        }
    }

    void close() override
    {
        asio::post(*m_context, [this] { closeStream(); });
        if (m_thread.joinable()) {
            m_thread.join();
        }
        closeStream(); // of a port that was never started
    }

private:
    void read()
    {
        m_stream.async_read_some(asio::buffer(m_buffer), [this](asio::error_code const& error, std::size_t count) {
            if (error) {
                lose();
                return;
            }
            m_onBytes(std::string_view(m_buffer.data(), count));
            read();
        });
    }

    // One write at a time, each with all that has gathered meanwhile.
    void writeNext()
    {
        std::lock_guard const lock(m_mutex);
        if (m_writing || m_outgoing.empty() || m_closed) {
            return;
        }
        m_writing = true;
        m_inFlight = std::exchange(m_outgoing, {});
        asio::async_write(m_stream, asio::buffer(m_inFlight), [this](asio::error_code const& error, std::size_t) {
            {
                std::lock_guard const again(m_mutex);
                m_writing = false;
            }
            if (error) {
                lose();
            } else {
                writeNext();
            }
        });
    }

    void lose()
    {
        if (closeStream()) {
            m_onLost();
        }
    }

    // True for the call that closed it.
    bool closeStream()
    {
        std::lock_guard const lock(m_mutex);
        if (std::exchange(m_closed, true)) {
            return false;
        }
        asio::error_code ignored;
        if constexpr (isSerial<Stream>) {
            leaveToOthers(m_stream);
        }
        m_stream.close(ignored);
        return true;
    }

    std::unique_ptr<asio::io_context> m_context;
    Stream m_stream;
    Receiver m_onBytes;
    LossHandler m_onLost;
    std::array<char, 4096> m_buffer{};
    std::string m_inFlight; // belongs to the write that is under way

    std::mutex m_mutex;
    std::string m_outgoing; // protected by m_mutex, as what follows and the closing of the stream
    bool m_writing = false;
    bool m_closed = false;

    std::thread m_thread;
};

} // namespace velmora
