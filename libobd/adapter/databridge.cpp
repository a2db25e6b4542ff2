#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/databridge.h>
#include <obd/idataconnection.h>

#include <algorithm>
#include <chrono>
#include <utility>

namespace obd {
namespace {

// Lets a writer loop look up regularly, since nothing wakes it when the channel dies.
constexpr std::chrono::milliseconds outgoingWait{100};

// More than hours of replies that nobody fetched.
constexpr std::size_t mostUnread = 16U * 1024 * 1024;

// What a queued message costs in memory, about: an empty one isn't free.
std::size_t cost(std::vector<unsigned char> const& message)
{
    return message.size() + 4 * sizeof(message);
}

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
    if (!hasRoomFor(bytes.size())) {
        if (invalidate()) {
            TERVEX_LOG(Error) << "Too many unread bytes from the adapter: invalidate the channel";
        }
        return;
    }
    auto const delimiter = static_cast<unsigned char>(m_delimiter.load());
    std::size_t const unscanned = firstUnscanned(delimiter);
    m_assembly.insert(m_assembly.end(), bytes.begin(), bytes.end());
    auto messageStart = m_assembly.begin();
    auto at = messageStart + static_cast<std::ptrdiff_t>(unscanned);
    while ((at = std::find(at, m_assembly.end(), delimiter)) != m_assembly.end()) {
        queueMessage(Bytes(messageStart, at));
        messageStart = ++at;
    }
    m_assembly.erase(m_assembly.begin(), messageStart);
}

bool DataBridge::hasRoomFor(std::size_t bytes)
{
    std::lock_guard const lock(m_incomingMutex);
    return m_incomingSize + m_assembly.size() + bytes <= mostUnread;
}

// The kept bytes hold no delimiter, unless it was another when they came.
std::size_t DataBridge::firstUnscanned(unsigned char delimiter)
{
    return std::exchange(m_scannedFor, delimiter) == delimiter ? m_assembly.size() : 0;
}

void DataBridge::queueMessage(Bytes message)
{
    {
        std::lock_guard const lock(m_incomingMutex);
        m_incomingSize += cost(message);
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
    m_incomingSize -= cost(m_incoming.front());
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
