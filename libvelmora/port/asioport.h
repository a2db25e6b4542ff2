#pragma once

#include "libvelmora/port/streamport.h"

#include <asio/io_context.hpp>
#include <asio/serial_port.hpp>

#include <memory>
#include <sys/ioctl.h>
#include <type_traits>
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

// A port over a stream that Asio has opened: a socket or a serial line.
template <typename Stream>
class AsioPort : public StreamPort
{
public:
    // context must be that of the open stream.
    AsioPort(std::unique_ptr<asio::io_context> context, Stream stream)
        : StreamPort(stream.native_handle(), isSerial<Stream> ? Kind::Line : Kind::Socket),
          m_context(std::move(context)), m_stream(std::move(stream))
    {}
    ~AsioPort() override { StreamPort::close(); }
    AsioPort(AsioPort const&) = delete;
    AsioPort& operator=(AsioPort const&) = delete;

private:
    void closeStream() override
    {
        asio::error_code ignored;
        if constexpr (isSerial<Stream>) {
            leaveToOthers(m_stream);
        }
        m_stream.close(ignored);
    }

    std::unique_ptr<asio::io_context> m_context;
    Stream m_stream;
};

} // namespace velmora
