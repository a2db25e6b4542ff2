#include "libobd/message/messageparser.h"

#include "libobd/message/canmessages.h"
#include "libobd/message/legacymessages.h"

#include <common/logrecord.h>

#include <ios>

namespace obd {

namespace {

bool parseByFamily(ObdProtocol protocol, std::vector<unsigned char> const& text, ResponseMap& responses)
{
    switch (protocol) {
    case ObdProtocolCan11:
    case ObdProtocolCan29:
        return parseCanMessages(protocol, text, responses);
    case ObdProtocolIso9141:
    case ObdProtocolIso14230:
    case ObdProtocolJ1850:
        return parseLegacyMessages(protocol, text, responses);
    case ObdProtocolUnknown:
        break;
    }
    return false;
}

void logFailure(ObdProtocol protocol, std::vector<unsigned char> const& text)
{
    tervex::LogRecord record(__FILE__, __LINE__, static_cast<int>(tervex::LogLevel::Fatal));
    record << "Failed MessageParser::parseResponseMessage (protocol:" << static_cast<int>(protocol) << std::hex;
    for (unsigned char const character : text) {
        record << ", 0x" << static_cast<unsigned int>(character);
    }
    record << ")";
}

} // namespace

bool MessageParser::parseResponseMessage(ObdProtocol protocol, std::vector<unsigned char> const& text,
                                         ResponseMap& responses)
{
    try {
        return parseByFamily(protocol, text, responses);
    } catch (...) {
        logFailure(protocol, text);
        throw;
    }
}

} // namespace obd
