// Parsing a reply beside bare hexadecimal decoding of the same text, by the same function, into memory that the caller
// keeps: decodeText into one piece, decodeFrames into one piece for each frame, as the parser must hand it out. Items
// are characters of the reply, so the rates of replies of different length compare: linear cost shows as the same rate.

#include "libobd/bytes/bytes.h"
#include "libobd/message/messageparser.h"

#include <benchmark/benchmark.h>

#include <algorithm>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace {

using Text = std::vector<unsigned char>;

Text characters(std::string const& text)
{
    return {text.begin(), text.end()};
}

std::string hexByte(unsigned int value)
{
    static constexpr char digits[] = "0123456789ABCDEF";
    return {digits[value >> 4 & 0xF], digits[value & 0xF]};
}

// Supported PIDs of one module, as most replies are: one frame.
Text singleFrame()
{
    return characters("7E8064100BE3FA81300");
}

// The same of the modules 7E8 to 7EF.
Text eightModules()
{
    std::string text;
    for (char const last : std::string_view("89ABCDEF")) {
        text += std::string("7E") + last + "064100BE3FA81300";
    }
    return characters(text);
}

// The longest message that a first frame can tell.
Text longMessage(std::string const& id)
{
    constexpr unsigned int length = 4095;
    std::string text = id + "1FFF490431323334";
    for (unsigned int slot = 0; 6 + 7 * slot < length; ++slot) {
        text += id + hexByte(0x20 | ((slot + 1) & 0xF));
        for (unsigned int i = 0; i < 7; ++i) {
            text += hexByte((slot + i) & 0xFF);
        }
    }
    return characters(text);
}

Text longMessage11()
{
    return longMessage("7E8");
}

Text longMessage29()
{
    return longMessage("18DAF110");
}

// Ten long messages one behind the other, each of another module.
Text tenLongMessages()
{
    std::string text;
    for (char const last : std::string_view("0123456789")) {
        Text const message = longMessage(std::string("70") + last);
        text.append(message.begin(), message.end());
    }
    return characters(text);
}

std::string repeated(std::string const& frame, int count)
{
    std::string text;
    while (count-- > 0) {
        text += frame;
    }
    return text;
}

// Lines of one module, as long answers are on ISO 14230 and J1850.
Text kwpLines()
{
    return characters(repeated("87F11049020100000031A5", 50));
}

Text kwpTenTimesAsMany()
{
    return characters(repeated("87F11049020100000031A5", 500));
}

Text saeLines()
{
    return characters(repeated("486B1049020100000031A5", 50));
}

Text saeTenTimesAsMany()
{
    return characters(repeated("486B1049020100000031A5", 500));
}

void decodeText(benchmark::State& state, Text (*reply)())
{
    Text const text = reply();
    for ([[maybe_unused]] auto _ : state) {
        Text bytes;
        obd::hexTextToBytes(text, bytes);
        benchmark::DoNotOptimize(bytes.data());
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(text.size()));
}

// frameCharacters is the length of every frame's text, its header left out; the same number of header characters stands
// before each.
void decodeFrames(benchmark::State& state, Text (*reply)(), std::size_t headerCharacters, std::size_t frameCharacters)
{
    Text const text = reply();
    for ([[maybe_unused]] auto _ : state) {
        std::vector<Text> frames;
        for (std::span<unsigned char const> rest = text; rest.size() > headerCharacters;
             rest = rest.subspan(std::min(headerCharacters + frameCharacters, rest.size()))) {
            Text& bytes = frames.emplace_back(frameCharacters / 2);
            obd::hexTextToBytes(rest.subspan(headerCharacters), bytes);
        }
        benchmark::DoNotOptimize(frames.data());
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(text.size()));
}

void parse(benchmark::State& state, obd::ObdProtocol protocol, Text (*reply)())
{
    Text const text = reply();
    for ([[maybe_unused]] auto _ : state) {
        obd::ResponseMap responses;
        if (!obd::MessageParser::parseResponseMessage(protocol, text, responses)) {
            state.SkipWithError("the reply could not be used");
            break;
        }
        benchmark::DoNotOptimize(responses);
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(text.size()));
}

// The cost of the result alone: the payloads are there, and get a map and memory of their own.
void store(benchmark::State& state, obd::ObdProtocol protocol, Text (*reply)())
{
    Text const text = reply();
    obd::ResponseMap ready;
    obd::MessageParser::parseResponseMessage(protocol, text, ready);
    for ([[maybe_unused]] auto _ : state) {
        obd::ResponseMap responses;
        for (auto const& [id, payload] : ready) {
            responses[id] = payload;
        }
        benchmark::DoNotOptimize(responses);
    }
    state.SetItemsProcessed(state.iterations() * static_cast<std::int64_t>(text.size()));
}

#define VELMORA_BENCH_REPLY(protocol, reply)                                                                           \
    BENCHMARK_CAPTURE(decodeText, reply, reply);                                                                       \
    BENCHMARK_CAPTURE(store, reply, protocol, reply);                                                                  \
    BENCHMARK_CAPTURE(parse, reply, protocol, reply)

BENCHMARK_CAPTURE(decodeFrames, singleFrame, singleFrame, 3, 16);
BENCHMARK_CAPTURE(decodeFrames, eightModules, eightModules, 3, 16);
BENCHMARK_CAPTURE(decodeFrames, longMessage11, longMessage11, 3, 16);

VELMORA_BENCH_REPLY(obd::ObdProtocolCan11, singleFrame);
VELMORA_BENCH_REPLY(obd::ObdProtocolCan11, eightModules);
VELMORA_BENCH_REPLY(obd::ObdProtocolCan11, longMessage11);
VELMORA_BENCH_REPLY(obd::ObdProtocolCan29, longMessage29);
VELMORA_BENCH_REPLY(obd::ObdProtocolCan11, tenLongMessages);
VELMORA_BENCH_REPLY(obd::ObdProtocolIso14230, kwpLines);
VELMORA_BENCH_REPLY(obd::ObdProtocolIso14230, kwpTenTimesAsMany);
VELMORA_BENCH_REPLY(obd::ObdProtocolJ1850, saeLines);
VELMORA_BENCH_REPLY(obd::ObdProtocolJ1850, saeTenTimesAsMany);

} // namespace
