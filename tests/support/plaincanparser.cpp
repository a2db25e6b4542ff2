#include "tests/support/plaincanparser.h"

#include "libobd/src/canresponse.h"
#include "libobd/src/hextext.h"

#include <cstddef>
#include <map>

namespace support {

namespace {

using Bytes = std::vector<unsigned char>;

Bytes takeFront(Bytes& text, std::size_t count)
{
    auto const end = text.begin() + static_cast<std::ptrdiff_t>(count);
    Bytes front(text.begin(), end);
    text.erase(text.begin(), end);
    return front;
}

unsigned int idOf(obd::ObdProtocol protocol, Bytes header)
{
    if (protocol == obd::ObdProtocolCan11) {
        header.insert(header.begin(), '0');
    }
    Bytes bytes;
    obd::hexTextToBytes(header, bytes);
    unsigned int id = 0;
    for (unsigned char const byte : bytes) {
        id = id << 8 | byte;
    }
    return id & 0x1FFFFFFF;
}

bool readFrames(obd::ObdProtocol protocol, Bytes& text, std::map<unsigned int, obd::CanResponse>& messages)
{
    std::size_t const headerCharacters = protocol == obd::ObdProtocolCan11 ? 3 : 8;
    do {
        if (text.size() < headerCharacters) {
            return !messages.empty();
        }
        obd::CanResponse& message = messages[idOf(protocol, takeFront(text, headerCharacters))];
        Bytes rest;
        obd::hexTextToBytes(text, rest);
        int const consumed = message.parse(rest);
        if (consumed < 0) {
            return true;
        }
        takeFront(text, 2 * static_cast<std::size_t>(consumed));
    } while (!text.empty());
    return true;
}

} // namespace

bool parsePlainly(obd::ObdProtocol protocol, std::vector<unsigned char> text, obd::ResponseMap& responses)
{
    std::map<unsigned int, obd::CanResponse> messages;
    if (!readFrames(protocol, text, messages)) {
        return false;
    }
    for (auto const& [id, message] : messages) {
        Bytes payload;
        if (message.payload(payload)) {
            responses[id] = payload;
        }
    }
    return !responses.empty();
}

} // namespace support
