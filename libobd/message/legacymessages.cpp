#include "libobd/message/legacymessages.h"

#include "libobd/bytes/bytes.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/nack.h>

#include <utility>

namespace obd {

namespace {

constexpr std::size_t headerBytes = 3;
constexpr std::size_t sourceIndex = 2;
constexpr std::size_t pendingBytes = 3;

// Removes the first count bytes and returns them.
ByteView takeFront(ByteView& bytes, std::size_t count)
{
    ByteView const front = slice(bytes, 0, count);
    bytes = bytes.subspan(count);
    return front;
}

// Whether the payload is a module's "response pending" and nothing else: 7F, the service, 78, and as many checksum
// bytes as the bus leaves on it.
bool isResponsePending(ByteView payload, std::size_t checksumBytes)
{
    return (payload.size() == pendingBytes || payload.size() == pendingBytes + checksumBytes) &&
           byteAt(payload, 0) == negativeReply && byteAt(payload, 2) == NackResponsePending;
}

// Joins a further frame to what came of its module. The answer that a module asked to wait for takes the place of the
// asking, as it does on CAN.
void append(std::vector<unsigned char>& payload, ByteView frame, std::size_t checksumBytes)
{
    if (isResponsePending(payload, checksumBytes)) {
        payload.clear();
    }
    payload.insert(payload.end(), frame.begin(), frame.end());
}

// The format byte of ISO 14230 tells the addressing in its top two bits, of which OBD uses 10 only, and the length.
void traceUnusualFormat(unsigned char format)
{
    if ((format & 0xC0) != 0x80) {
        tervex::TraceStream << "Invalid header bit: " << static_cast<unsigned int>(format);
    }
}

bool parseKwpFrames(ByteView rest, ResponseMap& payloads)
{
    do {
        if (rest.size() < headerBytes) {
            TERVEX_LOG(Error) << "Not enough data left: " << rest.size();
            return !payloads.empty();
        }
        ByteView const header = takeFront(rest, headerBytes);
        unsigned char const format = byteAt(header, 0);
        traceUnusualFormat(format);
        std::size_t const length = format & 0x3FU;
        std::size_t const checksumLength = rest.size() > length ? 1 : 0;
        if (rest.size() < length + checksumLength) {
            TERVEX_LOG(Error) << "Not enough data: " << rest.size() << " vs " << length + checksumLength;
            return !payloads.empty();
        }
        append(payloads[byteAt(header, sourceIndex)], takeFront(rest, length), 0);
        takeFront(rest, checksumLength);
    } while (!rest.empty());
    return true;
}

// Where the next frame with the same first two header bytes begins, or the size if there is none. Data that look like a
// header are taken for one: nothing in the text tells them apart.
std::size_t findNextHeader(ByteView rest, ByteView header)
{
    for (std::size_t i = 0; i + headerBytes <= rest.size(); ++i) {
        if (byteAt(rest, i) == byteAt(header, 0) && byteAt(rest, i + 1) == byteAt(header, 1)) {
            bool const sameSource = byteAt(rest, i + sourceIndex) == byteAt(header, sourceIndex);
            tervex::TraceStream << "Guessing response to be " << (sameSource ? "multiline" : "multi ECU");
            return i;
        }
    }
    return rest.size();
}

bool parseSaeFrames(ObdProtocol protocol, ByteView rest, ResponseMap& payloads)
{
    do {
        if (rest.size() <= headerBytes) {
            TERVEX_LOG(Error) << "Not enought data left: " << rest.size();
            return !payloads.empty();
        }
        ByteView const header = takeFront(rest, headerBytes);
        std::vector<unsigned char>& payload = payloads[byteAt(header, sourceIndex)];
        ByteView const frame = takeFront(rest, findNextHeader(rest, header));
        if (protocol == ObdProtocolIso9141) {
            append(payload, frame, 1);
        } else { // SAE J1850 modules don't ask to wait
            payload.insert(payload.end(), frame.begin(), frame.end());
        }
    } while (!rest.empty());
    return true;
}

} // namespace

bool parseLegacyMessages(ObdProtocol protocol, std::vector<unsigned char> const& text, ResponseMap& responses)
{
    std::vector<unsigned char> bytes;
    hexTextToBytes(text, bytes);
    ResponseMap payloads;
    bool const usable =
        protocol == ObdProtocolIso14230 ? parseKwpFrames(bytes, payloads) : parseSaeFrames(protocol, bytes, payloads);
    for (auto& [id, payload] : payloads) {
        responses[id] = std::move(payload);
    }
    return usable;
}

} // namespace obd
