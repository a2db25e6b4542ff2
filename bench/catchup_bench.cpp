// How long it takes until an hour without a broker is caught up: catchup_bench ADDRESS
//
// Fills a spool with 118,800 readings (33 a second) and sends them to the broker at ADDRESS (mqtt://HOST:PORT/TOPIC),
// by the real output. Tells the seconds from the connection's begin until the last acknowledgement.

#include "libvelmora/output/mqtt/mqttoutput.h"
#include "libvelmora/output/mqtt/spooltext.h"

#include <velmora/error.h>

#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <thread>
#include <unistd.h>

namespace {

using namespace velmora;

constexpr int hour = 118800;

void fill(std::string const& file)
{
    Spool spool(file, 1ULL << 30);
    std::vector<std::string> texts;
    for (int number = 0; number < hour; ++number) {
        Reading reading;
        reading.time = WallTime(std::chrono::milliseconds(1772352900000 + number * 30LL));
        reading.module = 0x7E8;
        reading.sensor = "SENSOR_" + std::to_string(number % 40);
        reading.value = number % 65536 / 4.0;
        reading.unit = "rpm";
        texts.push_back(spoolText(reading));
    }
    spool.add(texts);
}

} // namespace

int main(int argc, char** argv)
{
    if (argc != 2) {
        std::fputs("catchup_bench ADDRESS\n", stderr);
        return 2;
    }
    try {
        std::string const file = "/tmp/catchup_bench-" + std::to_string(::getpid()) + ".db";
        fill(file);
        OutputContext context;
        context.tell = [](std::string const& text) { std::fprintf(stderr, "%s\n", text.c_str()); };
        OutputAddress address = parseOutputAddress(argv[1]);
        addOption(address, "spool", file);
        addOption(address, "discovery", "off");
        MqttOutput output(address, context);
        auto const begin = std::chrono::steady_clock::now();
        output.open();
        while (output.state().waiting != std::uint64_t{0}) {
            std::this_thread::sleep_for(std::chrono::milliseconds(20));
        }
        std::printf("%d readings in %.2f s\n", hour,
                    std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count());
        output.close();
        std::filesystem::remove(file);
    } catch (Error const& error) {
        std::fprintf(stderr, "%s\n", error.what());
        return 1;
    }
    return 0;
}
