#include "libobd/adapter/elmscantool.h"
#include "libobd/adapter/elmtext.h"
#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

namespace obd {
namespace {

// The adapter's own search and a slow bus initialisation happen during this one read.
constexpr unsigned int probeTimeoutMs = 10000;

std::string numberOf(VehicleProtocol protocol)
{
    return upperHex(static_cast<unsigned int>(protocol));
}

} // namespace

bool ElmScantool::detectVehicle(VehicleProtocol protocol)
{
    if (setupProtocol(protocol)) {
        return true;
    }
    if (protocol != VehicleProtocol::Automatic) {
        TERVEX_LOG(Fatal) << "failed to detect protocol";
        return false;
    }
    tervex::TraceStream << "Automatic detection failed, trying manually";
    return searchProtocols();
}

bool ElmScantool::searchProtocols()
{
    constexpr int last = static_cast<int>(VehicleProtocol::Iso15765Can29Bit250);
    for (int number = 1; number <= last; ++number) {
        auto const protocol = static_cast<VehicleProtocol>(number);
        // Some vehicles need to be woken by the first request.
        if (setupProtocol(protocol) || setupProtocol(protocol)) {
            tervex::TraceStream << "detected working protocol";
            return true;
        }
    }
    return false;
}

bool ElmScantool::setupProtocol(VehicleProtocol protocol)
{
    m_enabled = false;
    if (!configureProtocol(protocol)) {
        return false;
    }
    std::string reply;
    if (!request("0100", reply, probeTimeoutMs)) {
        TERVEX_LOG(Fatal) << "empty response to 0100";
        return false;
    }
    if (!identifyProtocol()) {
        TERVEX_LOG(Fatal) << "Failed to identify protocol";
        return false;
    }
    if (!turnHeadersOn()) {
        TERVEX_LOG(Fatal) << "Failed to turn headers on";
        return false;
    }
    m_enabled = true;
    return true;
}

// An ELM is asked to try the protocol first, which leaves the one that it has stored alone.
bool ElmScantool::configureProtocol(VehicleProtocol protocol)
{
    return (hasResponse(device(), elmFamilyWord) && tryProtocol(protocol)) || setProtocol(protocol);
}

bool ElmScantool::tryProtocol(VehicleProtocol protocol)
{
    std::string const expected = trait(&ElmFamily::echoesProtocol) ? numberOf(protocol) + "=" : "OK";
    return executeCommonQuery(familyCommand(&ElmFamily::tryProtocol) + numberOf(protocol), expected,
                              "Failed to set try protocol");
}

bool ElmScantool::setProtocol(VehicleProtocol protocol)
{
    std::string const query = familyCommand(&ElmFamily::setProtocol) + numberOf(protocol);
    if (trait(&ElmFamily::echoesProtocol)) {
        return setEchoedProtocol(query, numberOf(protocol) + "=");
    }
    return executeCommonQuery(query, "OK", "Failed to set set protocol");
}

bool ElmScantool::setEchoedProtocol(std::string const& query, std::string const& expected)
{
    std::optional<std::string> reply = ask(query);
    if (!reply) {
        return false;
    }
    trim(query, *reply);
    if (hasResponse(*reply, expected)) {
        return true;
    }
    TERVEX_LOG(Fatal) << "Failed to find " << expected << ", looking for AUTO";
    if (hasResponse(*reply, "AUTO")) {
        return true;
    }
    TERVEX_LOG(Fatal) << "Failed to set protocol. Response: " << *reply;
    return false;
}

bool ElmScantool::identifyProtocol()
{
    return queryProtocolNumber() && queryProtocolDescription();
}

// The digit may stand behind an "A" for a protocol that the adapter found by itself. 0 is taken too: the protocol is
// then unknown. The letters of the adapter's further protocols aren't.
bool ElmScantool::queryProtocolNumber()
{
    std::string const query = familyCommand(&ElmFamily::protocolNumber);
    std::optional<std::string> reply = ask(query);
    if (!reply) {
        return false;
    }
    trim(query, *reply);
    reply->erase(0, reply->find_first_of("0123456789"));
    if (reply->empty()) {
        TERVEX_LOG(Fatal) << "Failed to query protocol number: " << *reply;
        return false;
    }
    m_protocol = static_cast<VehicleProtocol>(reply->front() - '0');
    return true;
}

bool ElmScantool::queryProtocolDescription()
{
    std::optional<std::string> reply = ask("ATDP");
    if (!reply) {
        return false;
    }
    cropWord("ATDP", *reply);
    cropWord("AUTO", *reply);
    cropWord(",", *reply);
    store(m_protocolDescription, reply->empty() ? "AUTO" : stripped(*reply));
    return true;
}

} // namespace obd
