#include "libvelmora/uds/replyframes.h"

#include "libvelmora/channel/canmessagelist.h"
#include "libvelmora/channel/replylines.h"

namespace velmora {

ReplyContent readReply(AddressedReply const& reply, BusKind bus)
{
    ReplyContent content;
    content.error = reply.error;
    content.broken = reply.broken;
    HabitCounts ignored{}; // the channel has counted them
    ModuleMessages messages(bus, ignored);
    for (std::size_t i = 0; i < reply.lines.size(); ++i) {
        ClassifiedLine const line = classifyLine(reply.lines[i]);
        std::optional<BusLine> const frame =
            line.kind == LineKind::Data ? parseBusLine(bus, line.text) : std::optional<BusLine>();
        if (line.kind == LineKind::Data && (!frame || !messages.add(*frame, line.text, i))) {
            content.broken = true;
        }
        if (line.kind == LineKind::Refused && content.error.empty()) {
            content.error = line.text;
        }
    }
    for (ModuleMessage const& message : messages.all()) {
        if (message.complete() && message.inOrder) {
            content.messages.push_back({message.module, message.payload});
        } else {
            content.broken = true;
        }
    }
    return content;
}

} // namespace velmora
