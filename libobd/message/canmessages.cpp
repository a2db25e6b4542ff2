#include "libobd/message/canmessages.h"

#include "libobd/bytes/bytes.h"
#include "libobd/message/canmodules.h"

#include <common/logrecord.h>
#include <common/tracestream.h>

#include <array>
#include <cstddef>
#include <ios>
#include <utility>

namespace obd {

namespace {

constexpr std::size_t header11Characters = 3;
constexpr std::size_t header29Characters = 8;

bool extract11BitId(ByteView& text, unsigned int& id)
{
    if (text.size() < header11Characters) {
        return false;
    }
    id = static_cast<unsigned int>(hexPairValue('0', text[0]) << 8 | hexPairValue(text[1], text[2]));
    text = text.subspan(header11Characters);
    return true;
}

bool extract29BitId(ByteView& text, unsigned int& id)
{
    if (text.size() < header29Characters) {
        return false;
    }
    auto const byte = [text](std::size_t index) { return hexPairValue(text[2 * index], text[2 * index + 1]); };
    id = static_cast<unsigned int>((byte(0) & 0x1F) << 24 | byte(1) << 16 | byte(2) << 8 | byte(3));
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
    std::size_t decoded = hexTextToBytes(text, std::span(bytes).first(CanResponse::FrameBytes));
    if (decoded == CanResponse::FrameBytes && CanResponse::reach(bytes[0]) > decoded) {
        decoded = hexTextToBytes(text, std::span(bytes).first(CanResponse::reach(bytes[0])));
    }
    return ByteView(bytes).first(decoded);
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

bool parseCanFrame(ObdProtocol protocol, ByteView& text, CanModules& modules)
{
    unsigned int id = 0;
    if (!extractEcuId(protocol, text, id)) {
        TERVEX_LOG(Fatal) << "Failed to extract ECU id";
        return false;
    }
    if (!extractPayload(text, modules[id])) {
        TERVEX_LOG(Fatal) << "Failed to extract message payload";
        return false;
    }
    return true;
}

bool parseCanFrames(ObdProtocol protocol, ByteView text, CanModules& modules)
{
    do {
        if (!parseCanFrame(protocol, text, modules)) {
            return !modules.empty();
        }
    } while (!text.empty());
    return true;
}

} // namespace

bool parseCanMessages(ObdProtocol protocol, ByteView text, ResponseMap& responses)
{
    CanModules modules;
    if (!parseCanFrames(protocol, text, modules)) {
        return false;
    }
    modules.drain([&responses](unsigned int id, CanResponse& message) {
        std::vector<unsigned char> payload;
        if (std::move(message).payload(payload)) {
            // Modules mostly answer in the order of their identifiers.
            responses.insert_or_assign(responses.end(), id, std::move(payload));
        } else {
            tervex::TraceStream << "Invalid data received for 0x" << std::hex << id;
        }
    });
    return !responses.empty();
}

} // namespace obd
