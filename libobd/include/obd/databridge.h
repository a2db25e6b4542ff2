#pragma once

#include <obd/export.h>
#include <obd/idatabridge.h>
#include <obd/idataconnection.h>

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <deque>
#include <mutex>
#include <vector>

namespace obd {

/// The byte channel between the application's port and the library: the application keeps the IDataBridge view for its
/// reader and writer loops and hands the IDataConnection view to the library. One bridge serves one connection; an
/// invalidated one stays so, and only isValid tells: all else goes on working. More than 16 MB of unread bytes, such as
/// a flood of prompts, invalidate it: what then comes is dropped.
///
/// Threads: send, receive, get, addLogger and removeLogger from any, set from one only.
///
///     auto const bridge = std::make_shared<obd::DataBridge>();
///     std::thread reader([&] { while (port.read(bytes)) bridge->set(bytes); bridge->invalidate(); });
///     std::thread writer([&] { while (bridge->isValid()) if (Bytes out; bridge->get(out)) port.write(out); });
///     car->getConnectionManager()->openConnection(bridge, obd::VehicleProtocol::Automatic, false);
class OBD_EXPORT DataBridge : public IDataBridge, public IDataConnection
{
public:
    DataBridge() = default;
    /// Wakes who still waits; nobody may be inside any more once the members go.
    ~DataBridge() override;

    DataBridge(DataBridge const&) = delete;
    DataBridge& operator=(DataBridge const&) = delete;

    bool invalidate() override;
    bool get(std::vector<unsigned char>& out) override;
    void set(std::vector<unsigned char> const& bytes) override;

    void setDelimiter(char delimiter) override;
    bool isValid() const override;
    bool receive(std::vector<unsigned char>& out, int timeoutMs) override;
    void send(std::vector<unsigned char> const& bytes) override;
    void addLogger(IConnectionLogger* logger) override;
    void removeLogger(IConnectionLogger* logger) override; ///< as IDataConnection says

private:
    using Bytes = std::vector<unsigned char>;

    bool hasRoomFor(std::size_t bytes);
    std::size_t firstUnscanned(unsigned char delimiter);
    void queueMessage(Bytes message);

    std::atomic<char> m_delimiter{0};
    /// Read under either side's mutex, changed under both.
    std::vector<IConnectionLogger*> m_loggers;

    Bytes m_outgoing;
    std::mutex m_outgoingMutex;
    std::condition_variable m_outgoingCondition;

    /// What set was given after the last delimiter. Belongs to the thread that calls set.
    Bytes m_assembly;
    /// The delimiter for which all of m_assembly was looked through. Belongs to that thread, too.
    unsigned char m_scannedFor = 0;
    std::deque<Bytes> m_incoming;
    std::size_t m_incomingSize = 0; ///< in memory, about; protected by m_incomingMutex
    std::mutex m_incomingMutex;
    std::condition_variable m_incomingCondition;

    std::atomic<int> m_invalidated{0};
};

} // namespace obd
