#include "libvelmora/channel/plainchannel.h"

#include <algorithm>

namespace velmora {

namespace {

// What has no end is handed on in pieces of that size.
constexpr std::size_t pieceLimit = 1U << 20U;

} // namespace

bool PlainChannel::receive(std::vector<unsigned char>& out, int timeoutMs)
{
    WireTime const until = m_wire->now() + WireTime(std::max(timeoutMs, 0));
    std::size_t end = m_buffer.find(m_delimiter);
    while (end == std::string::npos && m_buffer.size() < pieceLimit) {
        std::string const bytes = m_wire->read(until);
        m_buffer += bytes;
        end = m_buffer.find(m_delimiter);
        if (bytes.empty() && (m_wire->now() >= until || !isValid())) {
            break;
        }
    }
    if (end == std::string::npos && m_buffer.size() < pieceLimit) {
        return false;
    }
    std::size_t const size = std::min(end, m_buffer.size());
    out.assign(m_buffer.begin(), m_buffer.begin() + static_cast<std::ptrdiff_t>(size));
    m_buffer.erase(0, size + 1);
    std::lock_guard const lock(m_loggerMutex);
    for (obd::IConnectionLogger* logger : m_loggers) {
        logger->onDataReceived(out);
    }
    return true;
}

void PlainChannel::send(std::vector<unsigned char> const& bytes)
{
    m_wire->write({reinterpret_cast<char const*>(bytes.data()), bytes.size()});
    std::lock_guard const lock(m_loggerMutex);
    for (obd::IConnectionLogger* logger : m_loggers) {
        logger->onDataSent(bytes);
    }
}

void PlainChannel::addLogger(obd::IConnectionLogger* logger)
{
    std::lock_guard const lock(m_loggerMutex);
    m_loggers.push_back(logger);
}

void PlainChannel::removeLogger(obd::IConnectionLogger* logger)
{
    std::lock_guard const lock(m_loggerMutex);
    std::erase(m_loggers, logger);
}

} // namespace velmora
