// Modules beyond OBD as texts and documents; see <velmora/modules.h>.

#include "common/text/layout.h"
#include "libvelmora/report/json.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/modulestore.h"
#include "libvelmora/uds/udscodes.h"

#include <velmora/modules.h>

#include <fmt/format.h>

namespace velmora {

namespace {

std::string shownState(UdsModuleReport const& report, UdsTroubleCode const& code)
{
    if (!code.states.empty()) {
        return fmt::format("{}", fmt::join(code.states, ", "));
    }
    return (report.available.value_or(0) & mattersMask) != 0 ? "-" : "not told";
}

std::vector<Cell> udsRow(UdsModuleReport const& report, UdsTroubleCode const& code)
{
    std::string const hex = report.standard ? std::string() : " (" + code.hex + ")";
    std::string const text = code.meaning + (code.meaning.empty() || code.failure.empty() ? "" : "; ") + code.failure;
    return {{fmt::format("{}-{:02X}{}", code.code, code.type, hex)}, {shownState(report, code)}, {text}};
}

// Numbers and states as the module writes them: neither is settled by ISO 14230-3.
std::vector<Cell> kwpRow(UdsTroubleCode const& code)
{
    return {{code.hex}, {fmt::format("status {:02X}", code.status)}};
}

std::string udsModuleText(UdsModuleReport const& report, Style const& style)
{
    std::string const heading =
        fmt::format("Control module {}{}\n", report.module, report.name.empty() ? "" : ": " + report.name);
    if (report.answer != TopicAnswer::Read) {
        return heading + fmt::format("  service {} {}\n", report.byService18 ? 18 : 19, report.reason);
    }
    if (report.codes.empty()) {
        return heading + "  no codes\n";
    }
    std::vector<std::vector<Cell>> rows;
    for (UdsTroubleCode const& code : report.codes) {
        rows.push_back(report.byService18 ? kwpRow(code) : udsRow(report, code));
    }
    return heading + (report.byService18 ? "  by service 18, in numbers that may be the maker's own:\n" : "") +
           drawColumns(rows, "  ", style);
}

Json udsCodeJson(UdsTroubleCode const& code)
{
    return {{"code", code.code},
            {"type", fmt::format("{:02X}", code.type)},
            {"hex", code.hex},
            {"status", fmt::format("{:02X}", code.status)},
            {"states", code.states},
            {"meaning", textOrNull(code.meaning)},
            {"failure", textOrNull(code.failure)}};
}

Json byteJson(std::optional<unsigned char> const& byte)
{
    return byte ? Json(fmt::format("{:02X}", *byte)) : Json(nullptr);
}

Json udsModuleJson(UdsModuleReport const& report)
{
    Json codes = nullptr;
    Json byService18 = nullptr;
    if (report.answer == TopicAnswer::Read) {
        (report.byService18 ? byService18 : codes) = Json::array();
    }
    for (UdsTroubleCode const& code : report.codes) {
        if (report.byService18) {
            byService18.push_back({{"hex", code.hex}, {"status", fmt::format("{:02X}", code.status)}});
        } else {
            codes.push_back(udsCodeJson(code));
        }
    }
    Json json = {{"module", report.module},
                 {"name", textOrNull(report.name)},
                 {"reason", textOrNull(report.reason)},
                 {"format", byteJson(report.format)},
                 {"available", byteJson(report.available)},
                 {"codes", codes}};
    if (!byService18.is_null()) {
        json["byService18"] = byService18;
    }
    return json;
}

std::string dashed(std::string const& text)
{
    return text.empty() ? "-" : text;
}

} // namespace

std::string toText(std::vector<FoundModule> const& modules, TextStyle const& style)
{
    std::vector<std::vector<Cell>> rows{{{"asked"}, {"answers"}, {"name"}, {"part"}, {"software"}, {"codes"}}};
    for (FoundModule const& each : modules) {
        rows.push_back({{each.request},
                        {shownModule(each.reply)},
                        {dashed(each.name)},
                        {dashed(each.part)},
                        {dashed(each.software)},
                        {each.codes ? std::to_string(*each.codes) : "-", Mark::None, true}});
    }
    std::string text = drawColumns(rows, "  ", styleOf(style));
    for (FoundModule const& each : modules) {
        text += each.identifiers.empty() ? "" : fmt::format("\nControl module {}\n", shownModule(each.reply));
        for (auto const& [did, told] : each.identifiers) {
            text += fmt::format("  {:04X}  {:<58}  {}\n", did, identifierName(did), told);
        }
    }
    return text;
}

std::string toText(std::vector<UdsModuleReport> const& modules, TextStyle const& style)
{
    std::string text;
    for (UdsModuleReport const& each : modules) {
        text += udsModuleText(each, styleOf(style));
    }
    return text;
}

std::string toJson(std::vector<FoundModule> const& modules)
{
    Json document = Json::array();
    for (FoundModule const& each : modules) {
        document.push_back(toJsonValue(each));
    }
    return printed(document);
}

std::string toJson(std::vector<UdsModuleReport> const& modules)
{
    Json document = Json::array();
    for (UdsModuleReport const& each : modules) {
        document.push_back(udsModuleJson(each));
    }
    return printed(document);
}

} // namespace velmora
