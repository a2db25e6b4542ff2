#include "tests/support/dialogue/recordedreply.h"

#include "libobd/adapter/elmtransport.h"
#include "libobd/adapter/proxyerror.h"
#include "libobd/bytes/bytes.h"
#include "libobd/message/messageparser.h"

#include <obd/connectionprotocol.h>

#include <cctype>
#include <sstream>

namespace support {

namespace {

bool isHex(std::string const& text)
{
    return !text.empty() && text.find_first_not_of("0123456789ABCDEF") == std::string::npos;
}

// Puts the protocol bytes back, line by line.
class HeaderWriter
{
public:
    explicit HeaderWriter(obd::ObdProtocol family) : m_family(family) {}

    // Empty for a length line, which goes into the next.
    std::string write(std::string const& line)
    {
        if (line.size() == 3 && isHex(line)) {
            m_length = line;
            return {};
        }
        if (line.size() > 2 && line[1] == ':' && isHex(line.substr(0, 1)) && isHex(line.substr(2))) {
            return line[0] == '0' && !m_length.empty() ? firstFrame(line.substr(2))
                                                       : header() + "2" + line[0] + line.substr(2);
        }
        if (isHex(line) && line.size() % 2 == 0 && line.size() <= 14) {
            ++m_module;
            return header() + obd::upperHex(static_cast<unsigned int>(line.size() / 2), 2) + line;
        }
        return line;
    }

private:
    std::string firstFrame(std::string const& data)
    {
        ++m_module;
        std::string const line = header() + "1" + m_length + data;
        m_length.clear();
        return line;
    }

    std::string header() const
    {
        return m_family == obd::ObdProtocolCan29 ? obd::upperHex(0x18DAF110U + 8 * (m_module - 1))
                                                 : obd::upperHex(0x7E8U + m_module - 1);
    }

    obd::ObdProtocol m_family;
    std::string m_length;
    unsigned int m_module{0};
};

} // namespace

std::vector<Question> questionsOf(RecordedDialogue const& dialogue)
{
    bool headers = dialogue.header.at("headers") == "on";
    std::map<std::string, int> occurrences;
    std::vector<Question> questions;
    for (Exchange const& exchange : dialogue.exchanges) {
        headers = headers || compacted(exchange.request) == "ATH1";
        questions.push_back({exchange.request, ++occurrences[exchange.request], exchange.reply, headers});
    }
    return questions;
}

obd::ObdProtocol familyOf(RecordedDialogue const& dialogue)
{
    return obd::toObdProtocol(static_cast<obd::VehicleProtocol>(std::stoi(dialogue.header.at("protocol"))));
}

std::string compacted(std::string const& text)
{
    std::string result;
    for (char const c : text) {
        if (c != ' ') {
            result += static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
        }
    }
    return result;
}

obd::ResponseMap payloadsOf(obd::ObdProtocol family, std::string const& reply)
{
    obd::ResponseMap responses;
    std::size_t const prompt = reply.find('>');
    if (prompt == std::string::npos) {
        return responses;
    }
    std::vector<unsigned char> text(reply.begin(), reply.begin() + static_cast<std::ptrdiff_t>(prompt));
    obd::cleanReply(text);
    if (obd::checkForErrors(text) != obd::ProxyError::None) {
        return responses;
    }
    obd::removeBytes(text, " ");
    if (!text.empty()) {
        obd::MessageParser::parseResponseMessage(family, text, responses);
    }
    return responses;
}

std::string withHeaders(obd::ObdProtocol family, std::string const& reply)
{
    HeaderWriter writer(family);
    std::string result;
    std::istringstream lines(reply);
    for (std::string line; std::getline(lines, line, '\r');) {
        std::string const written = writer.write(compacted(line));
        result += written.empty() ? written : written + "\r";
    }
    return result;
}

} // namespace support
