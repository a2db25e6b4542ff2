#include "libvelmora/output/mqtt/spoolsender.h"

#include "libvelmora/output/mqtt/spooltext.h"

#include <velmora/error.h>

#include <algorithm>

namespace velmora {

namespace {

constexpr std::size_t readingsInBatch = 1000;
constexpr std::size_t bytesInBatch = 100000; // what all brokers take
constexpr std::size_t batchesUnderWay = 20;
constexpr std::chrono::seconds stuckAfter{30};
constexpr std::chrono::seconds longestPatience{
    1000}; // for a consumer that is away: what is sent again waits there twice

// Rows of one kind of time, and no more than a message may hold.
void cutBatch(std::vector<Spool::Row>& rows)
{
    std::size_t bytes = 0;
    std::size_t count = 0;
    for (Spool::Row const& each : rows) {
        bytes += each.text.size();
        if (count > 0 && (bytes > bytesInBatch || each.time != rows.front().time)) {
            break;
        }
        ++count;
    }
    rows.resize(count);
}

} // namespace

SpoolSender::SpoolSender(Spool& spool, std::string vehicle, bool waitsForMark, Publish publish, Tell tell)
    : m_spool(spool), m_vehicle(std::move(vehicle)), m_waitsForMark(waitsForMark), m_publish(std::move(publish)),
      m_tell(std::move(tell)), m_patience(stuckAfter)
{}

void SpoolSender::onUp(Time now)
{
    m_up = true;
    m_progress = now;
    startAgain();
}

void SpoolSender::onDown()
{
    m_up = false;
    startAgain();
}

// What is under way counts no longer: a delivery of a later batch must not stand for an earlier one.
void SpoolSender::startAgain()
{
    m_sent = m_stored;
    m_flights.clear();
    m_ended.clear();
}

void SpoolSender::onDelivered(int message, Time now)
{
    auto const flight = m_flights.find(message);
    if (flight == m_flights.end()) {
        return;
    }
    m_ended[flight->second] = true;
    m_flights.erase(flight);
    std::int64_t whole = 0;
    while (!m_ended.empty() && m_ended.begin()->second) {
        whole = m_ended.begin()->first;
        m_ended.erase(m_ended.begin());
    }
    if (!m_waitsForMark && whole > 0) {
        onProgress(now);
        keep(whole);
    }
    pump();
}

void SpoolSender::onRefused(int message)
{
    if (m_flights.contains(message)) {
        startAgain(); // with the next pump
    }
}

// A mark beyond what was ever written is of another spool, or made up; to believe it would lose readings.
void SpoolSender::onMark(std::int64_t seq, Time now)
{
    if (seq > m_spool.newest()) {
        m_tell("the consumer claims to have stored number " + std::to_string(seq) + ", which was never sent");
        return;
    }
    if (seq > m_stored) {
        onProgress(now);
        keep(seq);
        m_sent = std::max(m_sent, m_stored);
    }
    pump();
}

// What could not be forgotten is sent again one day, and known by its number.
void SpoolSender::keep(std::int64_t seq)
{
    m_stored = seq;
    try {
        m_spool.forget(seq);
    } catch (Error const& error) {
        m_tell(error.what());
    }
}

void SpoolSender::onProgress(Time now)
{
    m_progress = now;
    m_patience = stuckAfter;
}

// Messages, their acknowledgements and marks get lost when nodes of a cluster do.
bool SpoolSender::isStuck(Time now)
{
    bool const waits = m_up && (m_waitsForMark ? m_sent > m_stored : isUnderway());
    if (!waits) {
        m_progress = now;
        return false;
    }
    if (now - m_progress < m_patience) {
        return false;
    }
    m_progress = now;
    m_patience = std::min(2 * m_patience, longestPatience);
    return true;
}

void SpoolSender::pump()
{
    if (!m_up) {
        return;
    }
    try {
        while (m_flights.size() < batchesUnderWay && sendBatch()) {
        }
    } catch (Error const& error) {
        m_tell(error.what());
    }
}

bool SpoolSender::sendBatch()
{
    std::vector<Spool::Row> rows = m_spool.after(m_sent, readingsInBatch);
    if (rows.empty()) {
        return false;
    }
    cutBatch(rows);
    std::optional<int> const message = m_publish(batchText({m_vehicle, m_spool.id(), m_sent, m_stored}, rows));
    if (!message) {
        return false;
    }
    m_sent = rows.back().seq;
    m_flights[*message] = m_sent;
    m_ended[m_sent] = false;
    return true;
}

} // namespace velmora
