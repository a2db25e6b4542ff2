// What a watch takes from people, brokers and its own spool, by the first byte of the input: settings files, addresses
// of outputs, a consumer's mark, rows of a spool, what an adapter says when it is asked for the voltage.

#include "libvelmora/output/mqtt/mqttsettings.h"
#include "libvelmora/output/mqtt/spooltext.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/watch/voltageprobe.h"
#include "libvelmora/watch/watchsettings.h"

#include <velmora/error.h>

#include <cstdlib>
#include <string>

namespace {

using namespace velmora;

void settings(std::string const& text)
{
    try {
        WatchSettings const read = parseWatchSettings(text, "input");
        if (!read.vehicle.empty() && !isVehicleName(read.vehicle)) {
            std::abort();
        }
    } catch (Error const&) {
        // Refusing is right.
    }
}

// What was accepted must survive being written and read again.
void address(std::string const& text)
{
    try {
        OutputAddress const read = parseOutputAddress(text);
        OutputAddress const again = parseOutputAddress(toString(read));
        if (again.kind != read.kind || again.target != read.target) {
            std::abort();
        }
        if (read.kind.starts_with("mqtt")) {
            OutputContext context;
            MqttSettings const broker = mqttSettings(read, context);
            if (broker.topic.find("//") != std::string::npos || broker.brokers.empty() ||
                broker.brokers.front().port < 1) {
                std::abort();
            }
        }
    } catch (Error const&) {
        // Refusing is right.
    }
}

void mark(std::string const& text)
{
    storedMark(text, "0123456789abcdef");
}

// Moving the times there and back gives what was there, once it has been written by us.
void row(std::string const& text)
{
    std::string const once = shiftedText(text, 1000);
    if (shiftedText(shiftedText(once, 5000), -5000) != once) {
        std::abort();
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    if (size == 0) {
        return 0;
    }
    std::string const text(data + 1, data + size);
    switch (data[0] % 5) {
    case 0:
        settings(text);
        break;
    case 1:
        address(text);
        break;
    case 2:
        mark(text);
        break;
    case 3:
        row(text);
        break;
    default:
        findVolts(text);
    }
    return 0;
}
