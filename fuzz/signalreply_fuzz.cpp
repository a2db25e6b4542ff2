// Replies to signals: the lines of an adapter to messages, the answer among them, and what several identifiers told at
// once. The first byte chooses the bus, the next ones the request; the rest is what the adapter printed.

#include "libvelmora/channel/replylines.h"
#include "libvelmora/signal/signal.h"
#include "libvelmora/uds/combinedreply.h"
#include "libvelmora/uds/moduleasker.h"
#include "libvelmora/uds/refusalcode.h"
#include "libvelmora/uds/requeststate.h"

#include <algorithm>
#include <cstdlib>
#include <string>

namespace {

using namespace velmora;

constexpr BusKind buses[] = {BusKind::Can11, BusKind::Can29, BusKind::Kwp, BusKind::J1850, BusKind::Iso9141};
constexpr std::size_t requestBytes = 3;

void require(bool holds)
{
    if (!holds) {
        std::abort();
    }
}

// A positive answer repeats the request, a refusal is of its service.
void checkAnswer(std::vector<unsigned char> const& request, ModuleAnswer const& answer)
{
    if (answer.kind == ModuleAnswer::Kind::Positive) {
        require(!answer.payload.empty() && answer.payload[0] == (request[0] | 0x40U));
        bool const echoes = request[0] == 0x21 || request[0] == 0x22;
        std::size_t const echo = echoes ? echoLength(request) : 1;
        require(answer.payload.size() >= echo &&
                std::equal(request.begin() + 1, request.begin() + static_cast<std::ptrdiff_t>(echo),
                           answer.payload.begin() + 1));
    } else {
        require(answer.payload.empty() && !describe(answer).empty());
    }
    RequestState state;
    state.take(answer, RequestState::Time(std::chrono::seconds(1)));
    require(state.isDue(RequestState::Time(std::chrono::seconds(32))) || state.ended());
}

// What is divided is all of the reply, and each part as long as it was said to be.
void checkDivision(std::vector<unsigned char> const& payload)
{
    std::map<unsigned int, std::size_t> const lengths = {{0x0101, 1}, {0x0102, 4}, {0xF190, 17}};
    auto const parts = divideReply(payload, lengths);
    if (!parts || payload.empty()) {
        return;
    }
    std::size_t all = 1;
    for (auto const& [id, part] : *parts) {
        require(part.size() == 3 + lengths.at(id));
        all += part.size() - 1;
    }
    require(all == payload.size());
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    if (size <= 1 + requestBytes) {
        return 0;
    }
    std::vector<unsigned char> const request(data + 1, data + 1 + requestBytes);
    std::string const printed(data + 1 + requestBytes, data + size);
    HabitCounts counts{};
    AddressedReply reply;
    reply.answered = true;
    for (ReplyLine const& line : splitReply(printed, counts)) {
        reply.lines.push_back(line.text);
    }
    ReplyContent const content = readReply(reply, buses[data[0] % std::size(buses)]);
    checkAnswer(request, judgeReply(request, content));
    for (ModuleReply const& message : content.messages) {
        checkDivision(message.payload);
    }
    checkDivision({data, data + size});
    return 0;
}
