#pragma once

#include "libvelmora/channel/wire.h"

#include <obd/idataconnection.h>

#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace velmora {

// The bytes of a wire as they come, divided at the delimiter and else untouched: for who wants to see what an adapter
// really says. One thread at a time sends and receives.
class PlainChannel : public obd::IDataConnection
{
public:
    explicit PlainChannel(std::shared_ptr<IWire> wire) : m_wire(std::move(wire)) {}

    void setDelimiter(char delimiter) override { m_delimiter = delimiter; }
    bool isValid() const override { return m_wire->isUp(); }
    bool receive(std::vector<unsigned char>& out, int timeoutMs) override;
    void send(std::vector<unsigned char> const& bytes) override;
    void addLogger(obd::IConnectionLogger* logger) override;
    void removeLogger(obd::IConnectionLogger* logger) override;

private:
    std::shared_ptr<IWire> const m_wire;
    std::atomic<char> m_delimiter{'>'};
    std::string m_buffer;
    std::mutex m_loggerMutex;                       // held while a logger is called
    std::vector<obd::IConnectionLogger*> m_loggers; // protected by m_loggerMutex
};

} // namespace velmora
