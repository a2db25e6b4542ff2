#include "velmora/view/layout.h"
#include "velmora/view/vehiclereport.h"

#include <fmt/format.h>

namespace velmora {

namespace {

void addLine(std::string& text, char const* label, std::string const& value)
{
    if (!value.empty()) {
        text += labelledLine(label, value);
    }
}

void addAdapter(std::string& text, AdapterReport const& adapter)
{
    text += "Adapter\n";
    addLine(text, "Device", adapter.device);
    addLine(text, "Description", adapter.description);
    addLine(text, "Identifier", adapter.identification);
    addLine(text, "Voltage", adapter.volts ? fmt::format("{:.1f} V", *adapter.volts) : "-");
}

void addProtocol(std::string& text, ProtocolReport const& protocol)
{
    text += "\nProtocol\n";
    addLine(text, "Number", protocol.number ? std::to_string(*protocol.number) : "-");
    addLine(text, "Name", protocol.name);
}

void addModule(std::string& text, ModuleReport const& module, Style const& style)
{
    text += "\n" + moduleHeading(module.id, module.name) + "\n";
    addLine(text, "Description", module.description);
    addLine(text, "Standard", module.standard);
    addLine(text, "Sensors", std::to_string(module.supported.size()));
    text += toText(module.codes, style);
}

} // namespace

std::string toText(VehicleReport const& report, Style const& style)
{
    std::string text;
    addAdapter(text, report.adapter);
    addProtocol(text, report.protocol);
    for (ModuleReport const& module : report.modules) {
        addModule(text, module, style);
    }
    return text;
}

} // namespace velmora
