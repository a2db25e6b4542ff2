#pragma once

#include "libvelmora/channel/wire.h"

#include <obd/idataconnection.h>

#include <algorithm>
#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

namespace support {

// The bytes of a wire as they come, cut at prompts: a channel that neither hurries nor heals.
class PlainChannel : public obd::IDataConnection
{
public:
    explicit PlainChannel(std::shared_ptr<velmora::IWire> wire) : m_wire(std::move(wire)) {}

    void setDelimiter(char delimiter) override { m_delimiter = delimiter; }
    bool isValid() const override { return m_wire->isUp(); }

    bool receive(std::vector<unsigned char>& out, int timeoutMs) override
    {
        std::lock_guard const lock(m_mutex);
        velmora::WireTime const end = m_wire->now() + velmora::WireTime(std::max(timeoutMs, 0));
        for (;;) {
            m_buffer += m_wire->read(m_wire->now());
            std::size_t const at = m_buffer.find(m_delimiter);
            if (at != std::string::npos) {
                out.assign(m_buffer.begin(), m_buffer.begin() + static_cast<std::ptrdiff_t>(at));
                m_buffer.erase(0, at + 1);
                tell(&obd::IConnectionLogger::onDataReceived, out);
                return true;
            }
            if (m_wire->now() >= end || !isValid()) {
                return false;
            }
            m_buffer += m_wire->read(end);
        }
    }
    void send(std::vector<unsigned char> const& bytes) override
    {
        std::lock_guard const lock(m_mutex);
        m_wire->write(std::string(bytes.begin(), bytes.end()));
        tell(&obd::IConnectionLogger::onDataSent, bytes);
    }
    void addLogger(obd::IConnectionLogger* logger) override
    {
        std::lock_guard const lock(m_mutex);
        m_loggers.push_back(logger);
    }
    void removeLogger(obd::IConnectionLogger* logger) override
    {
        std::lock_guard const lock(m_mutex);
        std::erase(m_loggers, logger);
    }

private:
    template <typename Call>
    void tell(Call call, std::vector<unsigned char> const& bytes)
    {
        for (obd::IConnectionLogger* logger : m_loggers) {
            (logger->*call)(bytes);
        }
    }

    std::shared_ptr<velmora::IWire> m_wire;
    std::mutex m_mutex;
    std::string m_buffer;                           // protected by m_mutex
    std::vector<obd::IConnectionLogger*> m_loggers; // protected by m_mutex
    std::atomic<char> m_delimiter{'>'};
};

} // namespace support
