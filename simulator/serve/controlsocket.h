#pragma once

#include <asio/io_context.hpp>

#include <cstdint>
#include <functional>
#include <memory>
#include <string>

namespace obdsim {

/// Follows a control line; the answer, lines ended by LF. Throws ControlError.
using ControlHandler = std::function<std::string(std::string const& line)>;

/// The answer to line `number` as the host reads it: what the handler tells and "ok", or "error: line N, word ...".
std::string controlReply(ControlHandler const& handler, std::string const& line, int number);

/// Takes control lines from clients on a port of this machine alone, and answers each.
class ControlSocket
{
public:
    /// Port 0 takes a free one. Throws ServerError.
    ControlSocket(asio::io_context& context, std::uint16_t port, ControlHandler handler);
    ~ControlSocket();
    ControlSocket(ControlSocket const&) = delete;
    ControlSocket& operator=(ControlSocket const&) = delete;

    std::string address() const;

private:
    class Listener;
    std::shared_ptr<Listener> m_listener;
};

/// Takes control lines from standard input while this program is in the foreground; answers go to standard output,
/// mistakes to standard error.
class ControlInput
{
public:
    ControlInput(asio::io_context& context, ControlHandler handler);
    ~ControlInput();
    ControlInput(ControlInput const&) = delete;
    ControlInput& operator=(ControlInput const&) = delete;

private:
    class Reader;
    std::shared_ptr<Reader> m_reader;
};

} // namespace obdsim
