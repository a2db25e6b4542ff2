#include "libvelmora/port/serialportlist.h"
#include "libvelmora/report/json.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"

#include <fmt/format.h>

namespace velmora::cli {

namespace {

ExitCode listPorts(GlobalOptions const& options)
{
    std::vector<SerialPortEntry> const ports = listSerialPorts();
    if (options.json) {
        Json list = Json::array();
        for (SerialPortEntry const& port : ports) {
            list.push_back({{"device", port.device}, {"description", textOrNull(port.description)}});
        }
        fmt::print("{}", printed(list));
        return ExitCode::Done;
    }
    for (SerialPortEntry const& port : ports) {
        fmt::print("{}{}{}\n", port.device, port.description.empty() ? "" : "  ", port.description);
    }
    if (ports.empty()) {
        tell("No serial port that looks like an adapter. A network adapter needs none: --port HOST:PORT\n");
    }
    return ExitCode::Done;
}

} // namespace

void addPortsCommand(CommandLine& commandLine)
{
    commandLine.addCommand("ports", "List serial ports that look like adapters", listPorts);
}

} // namespace velmora::cli
