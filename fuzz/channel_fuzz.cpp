// The fast channel before an adapter that says whatever the input tells. The first byte chooses the bus, then each
// reply is a length and so many bytes; with bit 7 of the length it comes late. Whatever that is: each exchange ends
// within its time, and every line of digits that is handed on was said by the adapter, but for the filling of a last
// frame.

#include "libvelmora/channel/fastchannel.h"
#include "tests/support/wire/timedwire.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <iostream>
#include <optional>
#include <utility>

namespace {

using velmora::WireTime;

class InputWire : public support::TimedWire
{
public:
    InputWire(std::uint8_t const* data, std::size_t size) : m_data(data), m_size(size) {}

    void write(std::string_view bytes) override
    {
        if (bytes.starts_with("AT") && m_bringUp) {
            sayShown(std::string(bytes.starts_with("ATI") ? "ELM327 v1.5" : "OK") + "\r\r>", WireTime(5));
        } else {
            sayNext();
        }
    }
    bool resume() override { return false; }

    void endBringUp() { m_bringUp = false; }
    bool hasMore() const { return m_size > 0; }
    // All characters that were said, of those that a reply can hold.
    std::string const& said() const { return m_said; }

private:
    void sayNext()
    {
        if (m_size == 0) {
            return;
        }
        std::size_t const length = std::min<std::size_t>(m_data[0] & 0x7FU, m_size - 1);
        WireTime const delay((m_data[0] & 0x80U) != 0 ? 1700 : 10);
        std::string const text(reinterpret_cast<char const*>(m_data) + 1, length);
        m_data += length + 1;
        m_size -= length + 1;
        sayShown(text, delay);
        sayShown("\r>", delay);
    }
    void sayShown(std::string const& text, WireTime delay)
    {
        say(text, delay);
        for (char const character : text) {
            bool const shown = character > ' ' && character < '\x7F';
            m_said += shown ? velmora::compactText(std::string(1, character)) : "";
        }
    }

    std::uint8_t const* m_data;
    std::size_t m_size;
    std::string m_said;
    bool m_bringUp = true;
};

void require(bool holds, char const* what)
{
    if (!holds) {
        std::cerr << "Broken: " << what << '\n';
        std::abort();
    }
}

void speak(velmora::FastChannel& channel, std::string const& text, std::vector<unsigned char>& reply)
{
    std::string const line = text + "\r";
    reply.clear();
    channel.send({line.begin(), line.end()});
    for (int slice = 0; slice < 6 && !channel.receive(reply, 250); ++slice) {
    }
}

void requireSaid(std::string const& reply, std::string const& said)
{
    std::size_t begin = 0;
    while (begin < reply.size()) {
        std::size_t const end = std::min(reply.find('\r', begin), reply.size());
        std::string line = velmora::compactText(reply.substr(begin, end - begin));
        begin = end + 1;
        if (!std::all_of(line.begin(), line.end(), [](char c) { return velmora::hexDigitValue(c) >= 0; })) {
            continue;
        }
        line.erase(line.find_last_not_of('0') + 1);
        require(said.find(line) != std::string::npos, "a line that nobody said");
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(std::uint8_t const* data, std::size_t size)
{
    if (size < 2) {
        return 0;
    }
    auto const wire = std::make_shared<InputWire>(data + 1, size - 1);
    velmora::FastChannel channel(wire, {});
    std::vector<unsigned char> reply;
    for (std::string const& command : {std::string("ATI"), std::string("ATE0"), std::string("ATST64"),
                                       "ATTP" + std::to_string(1 + data[0] % 9), std::string("ATH1")}) {
        speak(channel, command, reply);
    }
    channel.onConnected();
    wire->endBringUp();
    constexpr char const* requests[] = {"010C", "0902", "010C", "03", "0100", "04", "ATRV", "010C"};
    for (std::size_t i = 0; wire->hasMore() && channel.isValid() && i < 100; ++i) {
        WireTime const before = wire->now();
        std::optional<velmora::AddressedModule> address;
        if (i % 16 == 12) { // seldom, since a header that is not taken back ends the connection
            address.emplace(channel, 0x7E8U);
        }
        speak(channel, requests[i % std::size(requests)], reply);
        address.reset();
        require(wire->now() - before < WireTime(30000), "an exchange that does not end");
        requireSaid(std::string(reply.begin(), reply.end()), wire->said());
    }
    return 0;
}
