#include "velmora/view/codereport.h"

#include <algorithm>
#include <fmt/format.h>
#include <nlohmann/json.hpp>

namespace velmora {

using Json = nlohmann::ordered_json;

namespace {

struct KindNames
{
    char const* title;
    char const* key;
};

KindNames const& names(CodeKind kind)
{
    static constexpr KindNames all[] = {{"Confirmed", "confirmed"}, {"Pending", "pending"}, {"Permanent", "permanent"}};
    return all[static_cast<int>(kind)];
}

char const* answerKey(CodeList::Answer answer)
{
    static constexpr char const* all[] = {"read", "refused", "no answer", "unreadable"};
    return all[static_cast<int>(answer)];
}

std::string summary(CodeList const& list)
{
    switch (list.answer) {
    case CodeList::Answer::Refused:
        return "refused: " + list.reason;
    case CodeList::Answer::Silent:
        return "no answer";
    case CodeList::Answer::Unreadable:
        return "the reply can't be read";
    case CodeList::Answer::Read:
        break;
    }
    if (list.codes.empty()) {
        return "none stored";
    }
    return list.codes.size() == 1 ? "1 code" : fmt::format("{} codes", list.codes.size());
}

std::string line(char const* label, std::string const& value)
{
    return fmt::format("  {:<14} {}\n", label, value);
}

char const* lampText(std::optional<bool> const& lamp)
{
    return !lamp ? "-" : *lamp ? "on" : "off";
}

} // namespace

bool hasFindings(CodeReport const& report)
{
    return report.lamp.value_or(false) ||
           std::any_of(report.lists.begin(), report.lists.end(),
                       [](CodeList const& list) { return list.kind != CodeKind::Pending && !list.codes.empty(); });
}

bool hasAnswer(CodeReport const& report)
{
    return std::any_of(report.lists.begin(), report.lists.end(),
                       [](CodeList const& list) { return list.answer == CodeList::Answer::Read; });
}

bool canBeChecked(CodeReport const& report)
{
    return report.lamp || std::any_of(report.lists.begin(), report.lists.end(), [](CodeList const& list) {
               return list.kind == CodeKind::Confirmed && list.answer == CodeList::Answer::Read;
           });
}

std::string toText(CodeReport const& report)
{
    std::string text = line("Lamp", lampText(report.lamp));
    for (CodeList const& list : report.lists) {
        text += line(names(list.kind).title, summary(list));
        for (TroubleCode const& code : list.codes) {
            text += toText(code, "    ");
        }
    }
    return text;
}

std::string toText(std::vector<ModuleCodes> const& modules)
{
    std::string text;
    for (ModuleCodes const& module : modules) {
        text += fmt::format("{}Control module {:X}: {}\n", text.empty() ? "" : "\n", module.id, module.name);
        text += toText(module.report);
    }
    return text;
}

Json toJsonValue(CodeReport const& report)
{
    Json document = {{"lamp", report.lamp ? Json(*report.lamp) : Json(nullptr)}};
    for (CodeList const& list : report.lists) {
        bool const read = list.answer == CodeList::Answer::Read;
        document[names(list.kind).key] = {{"answer", answerKey(list.answer)},
                                          {"reason", list.reason.empty() ? Json(nullptr) : Json(list.reason)},
                                          {"codes", read ? toJsonValue(list.codes) : Json(nullptr)}};
    }
    return document;
}

std::string toJson(std::vector<ModuleCodes> const& modules)
{
    Json list = Json::array();
    for (ModuleCodes const& module : modules) {
        Json entry = {{"id", fmt::format("{:X}", module.id)}, {"name", module.name}};
        entry.update(toJsonValue(module.report));
        list.push_back(entry);
    }
    return list.dump(2, ' ', false, Json::error_handler_t::replace) + "\n";
}

} // namespace velmora
