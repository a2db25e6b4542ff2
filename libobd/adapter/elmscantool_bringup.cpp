#include "libobd/adapter/elmscantool.h"
#include "libobd/adapter/elmtext.h"
#include "libobd/adapter/elmtransport.h"
#include "libobd/bytes/bytes.h"

#include <common/tracestream.h>

#include <algorithm>
#include <locale>
#include <sstream>

namespace obd {
namespace {

// The adapter counts its time-out in steps of 4 ms, in one byte.
constexpr unsigned int longestTimeoutMs = 1020;
constexpr unsigned int timeoutStepMs = 4;

// From this version on an adapter can leave out the spaces between bytes.
constexpr AdapterVersion firstWithoutSpaces{1, 3};

// Counted from 1; empty if there are fewer.
std::string wordOf(std::string const& text, unsigned int number)
{
    std::istringstream words(text);
    words.imbue(std::locale::classic());
    std::string word;
    for (unsigned int i = 0; i < number; ++i) {
        if (!(words >> word)) {
            return {};
        }
    }
    return word;
}

} // namespace

bool ElmScantool::initialize()
{
    m_disabled = false;
    if (!identifyInterface()) {
        return false;
    }
    updateDeviceIdentifier();
    return configure();
}

bool ElmScantool::identifyInterface()
{
    if (!sendString("ATI") || !parseInterface(receiveStrings({1500, 200}))) {
        return false;
    }
    updateDeviceDescription();
    return true;
}

// Reads the name line out of a reply to the reset or to the identity command, its echo included.
bool ElmScantool::parseInterface(std::string raw)
{
    cropBefore("ATZ", raw);
    cropWord("ATZ", raw);
    cropBefore("ATI", raw);
    cropWord("ATI", raw);
    cropWord("OK", raw);
    bool const named = !raw.empty();
    if (ElmFamily const* family = recogniseFamily(raw)) {
        tervex::TraceStream << family->label << raw;
        m_version = parseAdapterVersion(wordOf(raw, family->versionWord));
        store(m_device, std::move(raw));
    } else if (named) {
        tervex::TraceStream << "Unknown interface: " << raw;
        store(m_device, std::move(raw));
    }
    AdapterVersion const version = m_version;
    tervex::TraceStream << "Interface " << device() << " (" << version.majorNumber << "." << version.minorNumber << ")";
    return named;
}

bool ElmScantool::updateDeviceDescription()
{
    std::string const query = familyCommand(&ElmFamily::describe);
    std::optional<std::string> reply = ask(query);
    if (!reply) {
        return false;
    }
    cropWord(query, *reply);
    store(m_description, stripped(*reply));
    return true;
}

bool ElmScantool::updateDeviceIdentifier()
{
    std::string const query = familyCommand(&ElmFamily::identify);
    std::optional<std::string> reply = ask(query);
    if (!reply) {
        return false;
    }
    if (reply->empty()) {
        *reply = receiveString(500);
    }
    cropWord(query, *reply);
    cropWord("?", *reply);
    store(m_identification, stripped(*reply));
    return true;
}

// Only echo and line feeds must be off; old and cheap adapters may refuse the rest.
bool ElmScantool::configure()
{
    receiveString(50);
    m_connection->setDelimiter(elmPrompt);
    receiveString(50);
    if (!setEchoOff() || !setLinefeedOff()) {
        return false;
    }
    if (m_version.load().isAtLeast(firstWithoutSpaces)) {
        setSpacesOff();
    }
    setMemoryOff();
    setTimeout(400);
    return true;
}

bool ElmScantool::setEchoOff()
{
    return executeCommonQuery("ATE0", "OK", "Failed to set echo off");
}

bool ElmScantool::setLinefeedOff()
{
    return executeCommonQuery("ATL0", "OK", "Failed to set linefeed off");
}

bool ElmScantool::setSpacesOff()
{
    return executeCommonQuery("ATS0", "OK", "Failed to set spaces off");
}

bool ElmScantool::setMemoryOff()
{
    return executeCommonQuery("ATM0", "OK", "Failed to set memory off");
}

bool ElmScantool::restoreDefaults()
{
    return executeCommonQuery("ATD", "OK", "Failed to restore default settings");
}

bool ElmScantool::displayDlc()
{
    return executeCommonQuery("ATD1", "OK", "Failed to set display DLC");
}

bool ElmScantool::turnHeadersOn()
{
    bool const done = executeCommonQuery("ATH1", "OK", "Failed to set headers on");
    if (done) {
        m_headersOn = true;
    }
    return done;
}

bool ElmScantool::turnHeadersOff()
{
    bool const done = executeCommonQuery("ATH0", "OK", "Failed to set headers off");
    if (done) {
        m_headersOn = false;
    }
    return done;
}

bool ElmScantool::areHeadersOn() const
{
    return m_headersOn;
}

bool ElmScantool::setTimeout(unsigned int ms)
{
    unsigned int const limited = std::min(ms, longestTimeoutMs);
    tervex::TraceStream << "Set timeout to " << limited << " ms";
    return executeCommonQuery("ATST" + lowerHex(limited / timeoutStepMs), "OK", "Failed to set timeout");
}

bool ElmScantool::reset()
{
    return sendString("ATZ") && parseInterface(receiveStrings({1500, 1000, 500}));
}

bool ElmScantool::resetInterface()
{
    receiveString(200);
    return reset();
}

void ElmScantool::quickReset()
{
    sendString("ATZ");
}

bool ElmScantool::testConnectivity()
{
    constexpr int attempts = 2;
    for (int attempt = 0; attempt < attempts; ++attempt) {
        if (!sendString("ATI")) {
            return false;
        }
        if (isInterfaceSupported(receiveString(500))) {
            return true;
        }
    }
    return false;
}

} // namespace obd
