#include "libobd/adapter/elmtransport.h"

#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

#include <algorithm>
#include <string>

namespace obd {
namespace {

// The longest wait at a stretch: nothing wakes a waiter when the connection dies.
constexpr unsigned int waitSliceMs = 250;

// An adapter says something about once a command. One that never stops is none, or has lost its line rate.
constexpr int mostStaleReplies = 1000;

// False if the connection died meanwhile, or if there is no end to them.
bool discardStaleReplies(IDataConnection& connection)
{
    std::vector<unsigned char> stale;
    for (int discarded = 0; connection.receive(stale, 0); ++discarded) {
        if (discarded == mostStaleReplies) {
            TERVEX_LOG(Error) << "No end of unasked replies -> skip";
            return false;
        }
        tervex::TraceStream << "Payload data discarded: " << std::string(stale.begin(), stale.end());
        if (!connection.isValid()) {
            TERVEX_LOG(Error) << "Invalid connection -> skip";
            return false;
        }
    }
    return true;
}

// False if the time ran out or the connection died first.
bool waitForMessage(IDataConnection& connection, std::vector<unsigned char>& message, unsigned int timeoutMs)
{
    unsigned int remaining = timeoutMs;
    while (connection.isValid()) {
        unsigned int const slice = std::min(remaining, waitSliceMs);
        if (connection.receive(message, static_cast<int>(slice))) {
            return true;
        }
        if (remaining == slice) {
            return false;
        }
        remaining -= slice;
    }
    return false;
}

} // namespace

TransportStatus elmTransportSend(std::shared_ptr<IDataConnection>& connection,
                                 std::vector<unsigned char> const& payload)
{
    if (!connection->isValid()) {
        TERVEX_LOG(Error) << "Invalid connection -> skip";
        return TransportStatus::Timeout;
    }
    if (!discardStaleReplies(*connection)) {
        return TransportStatus::Timeout;
    }
    std::vector<unsigned char> line = payload;
    line.push_back(static_cast<unsigned char>(elmLineEnd));
    connection->send(line);
    return TransportStatus::Ok;
}

void cleanReply(std::vector<unsigned char>& data)
{
    removeBytes(data, lineFraming);
    std::erase(data, '?');
}

TransportStatus elmTransportReceive(std::shared_ptr<IDataConnection>& connection, std::vector<unsigned char>& data,
                                    unsigned int timeoutMs, bool* wasQuestion)
{
    data.clear();
    bool questioned = false;
    if (waitForMessage(*connection, data, timeoutMs)) {
        questioned = std::find(data.begin(), data.end(), '?') != data.end();
        cleanReply(data);
    }
    if (wasQuestion != nullptr) {
        *wasQuestion = questioned && data.empty();
    }
    if (!connection->isValid()) {
        TERVEX_LOG(Error) << "Invalid connection -> skip";
        return TransportStatus::Failure;
    }
    if (!data.empty()) {
        return TransportStatus::Ok;
    }
    if (timeoutMs != 0) {
        tervex::TraceStream << "Connection timeout: " << timeoutMs << " ms";
        return TransportStatus::Timeout;
    }
    TERVEX_LOG(Error) << "Failed to receive data";
    return TransportStatus::Failure;
}

} // namespace obd
