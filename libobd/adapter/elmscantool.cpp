#include "libobd/adapter/elmscantool.h"

#include "libobd/adapter/elmtext.h"
#include "libobd/adapter/elmtransport.h"
#include "libobd/bytes/bytes.h"
#include "libobd/message/messageparser.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/connectionprotocol.h>

#include <bit>
#include <cstdint>
#include <locale>
#include <sstream>
#include <utility>

namespace obd {
namespace {

// Reads "12.3V". Only the first decimal counts, and there must be one.
std::optional<float> parseVoltage(std::string const& reply)
{
    std::istringstream in(reply);
    in.imbue(std::locale::classic());
    int whole = 0;
    std::string fraction;
    if (!(in >> whole >> fraction) || fraction.size() < 2 || fraction[1] < '0' || fraction[1] > '9') {
        return std::nullopt;
    }
    return static_cast<float>((whole * 10.0 + (fraction[1] - '0')) / 10.0);
}

} // namespace

ElmScantool::ElmScantool(std::shared_ptr<IDataConnection> connection) : m_connection(std::move(connection))
{
    m_connection->setDelimiter(elmPrompt);
}

std::string ElmScantool::device()
{
    return guarded(m_device);
}

std::string ElmScantool::description()
{
    return guarded(m_description);
}

std::string ElmScantool::identification()
{
    return guarded(m_identification);
}

std::string ElmScantool::getProtocolDescription()
{
    return guarded(m_protocolDescription);
}

ObdProtocol ElmScantool::getProtocol()
{
    return toObdProtocol(m_protocol);
}

VehicleProtocol ElmScantool::vehicleProtocol()
{
    return m_protocol;
}

AdapterNote ElmScantool::lastNote()
{
    return m_note;
}

bool ElmScantool::isEnabled() const
{
    return m_enabled;
}

bool ElmScantool::batteryVoltage(float& volts)
{
    std::optional<float> const measured = parseVoltage(ask(familyCommand(&ElmFamily::voltage)).value_or(""));
    volts = measured.value_or(volts);
    return measured.has_value();
}

IDevice::Status ElmScantool::execute(std::string const& command, std::string& response, unsigned int timeoutMs)
{
    if (!sendString(command)) {
        return Status::NotSent;
    }
    response = receiveString(timeoutMs);
    return response.empty() ? noReplyStatus() : Status::Ok;
}

IDevice::Status ElmScantool::execute(std::vector<unsigned char> const& payload, ResponseMap& responses,
                                     unsigned int timeoutMs)
{
    std::vector<unsigned char> text;
    bytesToHexText(payload, text);
    if (!sendPayload(text)) {
        return Status::NotSent;
    }
    std::vector<unsigned char> reply;
    if (!receivePayload(reply, timeoutMs)) {
        return noReplyStatus();
    }
    std::erase(reply, ' ');
    // The reply parser finds the sender of a line in its header.
    if (!areHeadersOn()) {
        TERVEX_LOG(Error) << "Headers must be on!";
        return Status::Unparsed;
    }
    bool const parsed = !reply.empty() && MessageParser::parseResponseMessage(getProtocol(), reply, responses);
    return parsed ? Status::Ok : Status::Unparsed;
}

IDevice::Status ElmScantool::noReplyStatus() const
{
    return m_enabled ? Status::NoResponse : Status::NotEnabled;
}

bool ElmScantool::activateEcu(unsigned int ecu)
{
    return setCanFilter(ecu) && setCanMask(ecu);
}

bool ElmScantool::setCanFilter(unsigned int ecu)
{
    return executeCommonQuery("ATCF" + upperHex(ecu), "OK", "Failed to set CAN filter");
}

// Every bit up to the identifier's highest must match.
bool ElmScantool::setCanMask(unsigned int ecu)
{
    std::uint64_t const mask = (std::uint64_t{1} << std::bit_width(ecu | 1U)) - 1;
    return executeCommonQuery("ATCM" + upperHex(static_cast<unsigned int>(mask)), "OK", "Failed to set CAN mask");
}

void ElmScantool::close()
{
    enterLowPowerMode();
    setDisabled();
}

// The answer isn't judged: the adapter may be asleep already.
void ElmScantool::enterLowPowerMode()
{
    if (sendString("ATLP")) {
        std::string const response = receiveString(10);
        tervex::TraceStream << "Sent low power command, response: " << response;
    } else {
        tervex::TraceStream << "Failed to set to low power mode. Do quick reset.";
        quickReset();
    }
}

// The headers' state stays: the adapter keeps it too.
void ElmScantool::setDisabled()
{
    m_disabled = true;
    m_enabled = false;
    m_version = AdapterVersion{};
    m_protocol = VehicleProtocol::Automatic;
    std::lock_guard const lock(m_textMutex);
    m_device.clear();
    m_description.clear();
    m_identification.clear();
    m_protocolDescription.clear();
}

std::string ElmScantool::guarded(std::string const& text) const
{
    std::lock_guard const lock(m_textMutex);
    return text;
}

void ElmScantool::store(std::string& text, std::string value)
{
    std::lock_guard const lock(m_textMutex);
    text = std::move(value);
}

} // namespace obd
