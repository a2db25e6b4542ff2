#include "libobd/adapter/elmscantool.h"
#include "libobd/adapter/elmtext.h"
#include "libobd/adapter/elmtransport.h"

#include <common/logrecord.h>

namespace obd {

bool ElmScantool::sendPayload(std::vector<unsigned char> const& payload)
{
    m_note = AdapterNote::None;
    if (m_disabled) {
        return false;
    }
    if (elmTransportSend(m_connection, payload) == TransportStatus::Ok) {
        return true;
    }
    setDisabled();
    return false;
}

bool ElmScantool::receivePayload(std::vector<unsigned char>& data, unsigned int timeoutMs)
{
    bool wasQuestion = false;
    TransportStatus const status = elmTransportReceive(m_connection, data, timeoutMs, &wasQuestion);
    if (wasQuestion) {
        m_note = AdapterNote::NotUnderstood;
    }
    // Only now, since another thread may have given the channel up during the read.
    if (m_disabled) {
        return false;
    }
    if (status == TransportStatus::Failure) {
        setDisabled();
    }
    if (status != TransportStatus::Ok) {
        return false;
    }
    ProxyError const error = checkForErrors(data);
    if (error != ProxyError::None) {
        if (isReplyLost(data)) {
            m_note = AdapterNote::ReplyLost;
        }
        data.clear();
        TERVEX_LOG(Fatal) << "Got error from adapter: " << static_cast<int>(error);
        return false;
    }
    return true;
}

bool ElmScantool::sendString(std::string const& text)
{
    return sendPayload({text.begin(), text.end()});
}

std::string ElmScantool::receiveString(unsigned int timeoutMs)
{
    std::vector<unsigned char> data;
    if (!receivePayload(data, timeoutMs)) {
        return {};
    }
    return {data.begin(), data.end()};
}

std::string ElmScantool::receiveStrings(std::initializer_list<unsigned int> timeoutsMs)
{
    std::string text;
    for (unsigned int const timeoutMs : timeoutsMs) {
        text += receiveString(timeoutMs);
    }
    return text;
}

bool ElmScantool::request(std::string const& text, std::string& response, unsigned int timeoutMs)
{
    if (!sendString(text)) {
        return false;
    }
    response = receiveString(timeoutMs);
    return !response.empty();
}

std::optional<std::string> ElmScantool::ask(std::string const& command)
{
    if (!sendString(command)) {
        return std::nullopt;
    }
    return receiveStrings({500, 200});
}

bool ElmScantool::executeCommonQuery(std::string const& command, std::string const& expected,
                                     std::string const& errorText)
{
    std::optional<std::string> reply = ask(command);
    if (!reply) {
        return false;
    }
    trim(command, *reply);
    bool const answered = hasResponse(*reply, expected);
    if (!answered && !errorText.empty()) {
        TERVEX_LOG(Fatal) << errorText << ". Response: " << *reply;
    }
    return answered;
}

} // namespace obd
