#pragma once

#include "libvelmora/port/iport.h"

#include <asio/buffer.hpp>
#include <asio/io_context.hpp>
#include <asio/post.hpp>
#include <asio/write.hpp>

#include <array>
#include <memory>
#include <string>
#include <thread>
#include <utility>

namespace velmora {

// A port over an Asio stream: a socket or a serial line. All work on the stream is done by the port's thread.
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
        asio::post(*m_context, [this, text = std::string(bytes)] {
            m_outgoing += text;
            writeNext();
        });
    }

    void close() override
    {
        asio::post(*m_context, [this] {
            m_closed = true;
            asio::error_code ignored;
            m_stream.close(ignored);
        });
        if (m_thread.joinable()) {
            m_thread.join();
        }
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
        if (m_writing || m_outgoing.empty() || m_closed) {
            return;
        }
        m_writing = true;
        m_inFlight = std::exchange(m_outgoing, {});
        asio::async_write(m_stream, asio::buffer(m_inFlight), [this](asio::error_code const& error, std::size_t) {
            m_writing = false;
            if (error) {
                lose();
            } else {
                writeNext();
            }
        });
    }

    void lose()
    {
        if (!std::exchange(m_closed, true)) {
            asio::error_code ignored;
            m_stream.close(ignored);
            m_onLost();
        }
    }

    std::unique_ptr<asio::io_context> m_context;
    Stream m_stream;
    Receiver m_onBytes;
    LossHandler m_onLost;
    std::array<char, 4096> m_buffer{};
    std::string m_outgoing;
    std::string m_inFlight;
    bool m_writing = false;
    bool m_closed = false;
    std::thread m_thread;
};

} // namespace velmora
