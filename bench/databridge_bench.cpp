#include <obd/databridge.h>

#include <benchmark/benchmark.h>

#include <string_view>
#include <thread>

namespace {

using Bytes = std::vector<unsigned char>;

Bytes bytes(std::string_view text)
{
    return {text.begin(), text.end()};
}

// One exchange as the library makes it, the port's part played on the same thread: the cost of the bridge alone.
void exchange(benchmark::State& state)
{
    obd::DataBridge bridge;
    bridge.setDelimiter('>');
    Bytes const request = bytes("010C\r");
    Bytes const reply = bytes("7E8 04 41 0C 1A F8 \r\r>");
    Bytes taken;
    Bytes message;
    for (auto _ : state) {
        bridge.send(request);
        bridge.get(taken);
        bridge.set(reply);
        bridge.receive(message, 0);
        benchmark::DoNotOptimize(message.data());
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(exchange);

// A reply of 4 KiB delivered in pieces of the given size, as a slow serial port or a fast socket hands it over.
void delivery(benchmark::State& state)
{
    constexpr std::size_t replySize = 4096;
    auto const pieceSize = static_cast<std::size_t>(state.range(0));
    obd::DataBridge bridge;
    bridge.setDelimiter('>');
    Bytes const piece(pieceSize, 'A');
    Bytes const end = bytes(">");
    Bytes message;
    for (auto _ : state) {
        for (std::size_t sent = 0; sent < replySize; sent += pieceSize) {
            bridge.set(piece);
        }
        bridge.set(end);
        bridge.receive(message, 0);
        benchmark::DoNotOptimize(message.data());
    }
    state.SetBytesProcessed(state.iterations() * static_cast<std::int64_t>(replySize));
}
BENCHMARK(delivery)->Arg(1)->Arg(16)->Arg(256)->Arg(4096);

// One exchange with the port on a thread of its own: two wake-ups.
void roundTrip(benchmark::State& state)
{
    obd::DataBridge bridge;
    bridge.setDelimiter('>');
    std::thread port([&bridge] {
        Bytes const reply = bytes("7E8 04 41 0C 1A F8 \r\r>");
        Bytes taken;
        while (bridge.isValid()) {
            taken.clear();
            if (bridge.get(taken)) {
                bridge.set(reply);
            }
        }
    });
    Bytes const request = bytes("010C\r");
    Bytes message;
    for (auto _ : state) {
        bridge.send(request);
        if (!bridge.receive(message, 1000)) {
            state.SkipWithError("no reply");
            break;
        }
    }
    bridge.invalidate();
    port.join();
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK(roundTrip)->UseRealTime();

} // namespace
