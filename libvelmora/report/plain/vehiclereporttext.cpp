#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

namespace velmora {

namespace {

void addLine(std::string& text, char const* label, std::string const& value)
{
    if (!value.empty()) {
        text += labelledLine(label, value);
    }
}

std::string adapterText(AdapterReport const& adapter)
{
    std::string text = std::string(texts::adapter) + "\n";
    addLine(text, texts::device, adapter.device);
    addLine(text, texts::description, adapter.description);
    addLine(text, texts::identifier, adapter.identification);
    return text + labelledLine(texts::plain::volts, adapter.volts ? fmt::format("{:.1f} V", *adapter.volts) : "");
}

std::string protocolText(ProtocolReport const& protocol)
{
    std::string text = std::string(texts::protocol) + "\n";
    text += labelledLine(texts::plain::number, protocol.number ? std::to_string(*protocol.number) : "");
    addLine(text, texts::name, protocol.name);
    return text;
}

// What a module does not offer is left out.
template <typename Report>
std::string topicText(Report const& report, Style const& style)
{
    return report.answer == TopicAnswer::NotOffered ? std::string() : toText(report, style);
}

// The lamp stands with the codes.
std::string readinessText(ReadinessReport report, Style const& style)
{
    report.lamp.reset();
    return topicText(report, style);
}

std::string valuesText(std::vector<LiveValue> const& values, Style const& style)
{
    if (values.empty()) {
        return {};
    }
    std::vector<std::vector<Cell>> rows;
    for (LiveValue const& value : values) {
        rows.push_back({{value.name}, {value.value.empty() ? "-" : value.value, Mark::None, true}, {value.unit}});
    }
    return std::string("  ") + texts::values + "\n" + drawColumns(rows, "    ", style);
}

std::string moduleText(ModuleReport const& module, Style const& style)
{
    std::string text = moduleHeading(module.id, module.name) + "\n" + toText(module.info, style) +
                       labelledLine(texts::sensors, std::to_string(module.supported.size()));
    for (std::string const& topic :
         {toText(module.codes, style), topicText(module.freeze, style), readinessText(module.readiness, style),
          topicText(module.monitors, style), topicText(module.oxygen, style), topicText(module.counters, style),
          valuesText(module.values, style)}) {
        text += topic.empty() ? "" : "\n" + topic;
    }
    return text;
}

} // namespace

std::string moduleHeading(unsigned int id, std::string const& name)
{
    return fmt::format("{} {:X}{}{}", texts::module, id, name.empty() ? "" : ": ", name);
}

std::string toText(VehicleReport const& report, Style const& style, std::optional<InspectionReport> const& inspection)
{
    std::string text =
        adapterText(report.adapter) + "\n" + protocolText(report.protocol) + "\n" + toText(findings(report), style);
    text += inspection ? "\n" + toText(*inspection, style) : std::string();
    for (ModuleReport const& module : report.modules) {
        text += "\n" + moduleText(module, style);
    }
    return text;
}

} // namespace velmora
