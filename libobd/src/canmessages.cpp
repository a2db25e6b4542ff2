#include "libobd/src/canmessages.h"

#include "libobd/src/canresponse.h"
#include "libobd/src/hextext.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

#include <array>
#include <cstddef>
#include <ios>
#include <map>
#include <utility>

namespace obd {

namespace {

using CanResponses = std::map<unsigned int, CanResponse>;

constexpr std::size_t header11Characters = 3;
constexpr std::size_t header29Characters = 8;

bool extract11BitId(ByteView& text, unsigned int& id)
{
    if (text.size() < header11Characters) {
        return false;
    }
    std::array<unsigned char, 4> const padded = {'0', text[0], text[1], text[2]};
    std::array<unsigned char, 2> bytes{};
    hexTextToBytes(padded, bytes);
    id = static_cast<unsigned int>(bytes[0] << 8 | bytes[1]);
    text = text.subspan(header11Characters);
    return true;
}

bool extract29BitId(ByteView& text, unsigned int& id)
{
    if (text.size() < header29Characters) {
        return false;
    }
    std::array<unsigned char, 4> bytes{};
    hexTextToBytes(text, bytes);
    id = static_cast<unsigned int>((bytes[0] & 0x1F) << 24 | bytes[1] << 16 | bytes[2] << 8 | bytes[3]);
    text = text.subspan(header29Characters);
    return true;
}

bool extractEcuId(ObdProtocol protocol, ByteView& text, unsigned int& id)
{
    return protocol == ObdProtocolCan11 ? extract11BitId(text, id) : extract29BitId(text, id);
}

// How long the frame is only its own bytes tell. What stands behind it is decoded as far as one frame can reach and no
// further, so that a long reply is not decoded anew for every frame.
ByteView decodeFrame(ByteView text, std::array<unsigned char, CanResponse::MaxFrameBytes>& bytes)
{
    std::size_t const pciBytes = hexTextToBytes(text, std::span(bytes).first(1));
    std::size_t const reach = pciBytes == 0 ? 0 : CanResponse::reach(bytes[0]);
    return ByteView(bytes).first(hexTextToBytes(text, std::span(bytes).first(reach)));
}

bool extractPayload(ByteView& text, CanResponse& response)
{
    std::array<unsigned char, CanResponse::MaxFrameBytes> bytes;
    int const consumed = response.parse(decodeFrame(text, bytes));
    if (consumed < 0) {
        TERVEX_LOG(Fatal) << "Failed to parse message payload";
        return false;
    }
    text = text.subspan(2 * static_cast<std::size_t>(consumed));
    return true;
}

bool parseCanFrame(ObdProtocol protocol, ByteView& text, CanResponses& messages)
{
    unsigned int id = 0;
    if (!extractEcuId(protocol, text, id)) {
        TERVEX_LOG(Fatal) << "Failed to extract ECU id";
        return false;
    }
    if (!extractPayload(text, messages[id])) {
        TERVEX_LOG(Fatal) << "Failed to extract message payload";
        return false;
    }
    return true;
}

bool parseCanFrames(ObdProtocol protocol, ByteView text, CanResponses& messages)
{
    do {
        if (!parseCanFrame(protocol, text, messages)) {
            return !messages.empty();
        }
    } while (!text.empty());
    return true;
}

} // namespace

bool parseCanMessages(ObdProtocol protocol, ByteView text, ResponseMap& responses)
{
    CanResponses messages;
    if (!parseCanFrames(protocol, text, messages)) {
        return false;
    }
    for (auto& [id, message] : messages) {
        std::vector<unsigned char> payload;
        if (std::move(message).payload(payload)) {
            responses[id] = std::move(payload);
        } else {
            tervex::TraceStream << "Invalid data received for 0x" << std::hex << id;
        }
    }
    return !responses.empty();
}

} // namespace obd
