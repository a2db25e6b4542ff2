#include "libobd/adapter/elmscantool.h"
#include "libobd/adapter/elmtransport.h"
#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>

#include <algorithm>
#include <span>

namespace obd {
namespace {

struct BaudRateCode
{
    BaudRate rate;
    std::string_view code;
};

// The divisor of 4 MHz that gives the rate, in hexadecimal.
constexpr BaudRateCode divisors[] = {
    {19200, "D0"},
    {38400, "68"},
    {57600, "45"},
    {115200, "23"},
};

constexpr BaudRateCode obdProsCodes[] = {
    {9600, "1"}, {19200, "3"}, {38400, "4"}, {57600, "5"}, {115200, "6"},
};

// Empty for a rate that the adapter doesn't know.
std::string commandFor(std::string const& command, std::span<BaudRateCode const> codes, BaudRate rate)
{
    auto const found =
        std::find_if(codes.begin(), codes.end(), [rate](BaudRateCode const& row) { return row.rate == rate; });
    return found != codes.end() ? command + std::string(found->code) : std::string();
}

// The adapter counts this time in steps of 5 ms, in one byte.
constexpr unsigned int longestSetTimeoutMs = 1275;
constexpr unsigned int setTimeoutStepMs = 5;

// During a change of the rate replies end with their line, and no prompt follows. The prompt is back at the end,
// whatever happens in between.
class LineDelimiter
{
public:
    explicit LineDelimiter(IDataConnection& connection) : m_connection(connection)
    {
        m_connection.setDelimiter(elmLineEnd);
    }
    ~LineDelimiter() { m_connection.setDelimiter(elmPrompt); }
    LineDelimiter(LineDelimiter const&) = delete;
    LineDelimiter& operator=(LineDelimiter const&) = delete;

private:
    IDataConnection& m_connection;
};

} // namespace

BaudRateDialogue ElmScantool::baudRateDialogue()
{
    return trait(&ElmFamily::baudRate);
}

bool ElmScantool::setBaudRateSetTimeout(unsigned int ms)
{
    if (baudRateDialogue() == BaudRateDialogue::Code) {
        return true;
    }
    unsigned int const steps = std::min(ms, longestSetTimeoutMs) / setTimeoutStepMs;
    return executeCommonQuery("ATBRT" + upperHex(steps, 2), "OK", "Failed to set baud rate set timeout");
}

bool ElmScantool::changeBaudRate(BaudRate rate)
{
    std::string const query = changeBaudRateCommand(rate);
    if (query.empty()) {
        TERVEX_LOG(Fatal) << "Baud rate not supported: " << rate;
        return false;
    }
    LineDelimiter const lines(*m_connection);
    return executeCommonQuery(query, "OK", "Failed to get response to baud rate change");
}

std::string ElmScantool::changeBaudRateCommand(BaudRate rate)
{
    switch (baudRateDialogue()) {
    case BaudRateDialogue::Code:
        return commandFor("ATSCS", obdProsCodes, rate);
    case BaudRateDialogue::Refused:
        TERVEX_LOG(Fatal) << "OBDKey doesn't really support the feature";
        return {};
    default:
        return commandFor("ATBRD", divisors, rate);
    }
}

bool ElmScantool::handleBaudRateChange()
{
    if (baudRateDialogue() == BaudRateDialogue::Code) {
        return testConnectivity();
    }
    std::string identity;
    {
        LineDelimiter const lines(*m_connection);
        identity = receiveStrings({500, 200});
    }
    return isInterfaceSupported(identity) &&
           executeCommonQuery("", "OK", "Failed to get final response to baud rate change");
}

} // namespace obd
