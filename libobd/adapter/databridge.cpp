#include <common/tracestream.h>
#include <obd/databridge.h>
#include <obd/iconnectionlogger.h>

#include <algorithm>
#include <chrono>
#include <utility>

namespace obd {
namespace {

// Lets a writer loop look up regularly, since nothing wakes it when the channel dies.
constexpr std::chrono::milliseconds outgoingWait{100};

} // namespace

DataBridge::~DataBridge()
{
    m_incomingCondition.notify_all();
    m_outgoingCondition.notify_all();
}

bool DataBridge::invalidate()
{
    tervex::TraceStream << "Invalidate DataBridge";
    return m_invalidated.exchange(1) == 0;
}

bool DataBridge::get(Bytes& out)
{
    std::unique_lock lock(m_outgoingMutex);
    m_outgoingCondition.wait_for(lock, outgoingWait, [this] { return !m_outgoing.empty(); });
    if (!m_outgoing.empty()) {
        out = std::exchange(m_outgoing, {});
    }
    return !out.empty();
}

void DataBridge::set(Bytes const& bytes)
{
    m_assembly.insert(m_assembly.end(), bytes.begin(), bytes.end());
    // From the very start each time: the delimiter may have changed since the kept bytes came.
    auto messageStart = m_assembly.begin();
    for (auto at = messageStart; at != m_assembly.end(); ++at) {
        if (*at == static_cast<unsigned char>(m_delimiter.load())) {
            queueMessage(Bytes(messageStart, at));
            messageStart = at + 1;
        }
    }
    m_assembly.erase(m_assembly.begin(), messageStart);
}

void DataBridge::queueMessage(Bytes message)
{
    {
        std::lock_guard const lock(m_incomingMutex);
        m_incoming.push_back(std::move(message));
    }
    m_incomingCondition.notify_one();
}

void DataBridge::setDelimiter(char delimiter)
{
    m_delimiter = delimiter;
}

bool DataBridge::isValid() const
{
    return m_invalidated == 0;
}

bool DataBridge::receive(Bytes& out, int timeoutMs)
{
    std::unique_lock lock(m_incomingMutex);
    m_incomingCondition.wait_for(lock, std::chrono::milliseconds(timeoutMs), [this] { return !m_incoming.empty(); });
    if (m_incoming.empty()) {
        return false;
    }
    out = std::move(m_incoming.front());
    m_incoming.pop_front();
    for (IConnectionLogger* logger : m_loggers) {
        logger->onDataReceived(out);
    }
    return true;
}

void DataBridge::send(Bytes const& bytes)
{
    std::lock_guard const lock(m_outgoingMutex);
    m_outgoing.insert(m_outgoing.end(), bytes.begin(), bytes.end());
    m_outgoingCondition.notify_one();
    for (IConnectionLogger* logger : m_loggers) {
        logger->onDataSent(bytes);
    }
}

void DataBridge::addLogger(IConnectionLogger* logger)
{
    std::scoped_lock const lock(m_outgoingMutex, m_incomingMutex);
    m_loggers.push_back(logger);
}

void DataBridge::removeLogger(IConnectionLogger* logger)
{
    std::scoped_lock const lock(m_outgoingMutex, m_incomingMutex);
    auto const found = std::find(m_loggers.begin(), m_loggers.end(), logger);
    if (found != m_loggers.end()) {
        m_loggers.erase(found);
    }
}

} // namespace obd
