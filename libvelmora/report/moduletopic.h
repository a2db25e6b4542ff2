#pragma once

#include "libvelmora/report/json.h"

#include <velmora/topics.h>

#include <fmt/format.h>

#include <algorithm>
#include <concepts>
#include <string>
#include <vector>

namespace velmora {

// "read", "not supported", "no answer", "unreadable" or "refused".
char const* answerWord(TopicAnswer answer);

template <typename Report>
concept HasTopicAnswer = requires(Report const& report)
{
    {
        report.answer
        } -> std::convertible_to<TopicAnswer>;
};

template <HasTopicAnswer Report>
bool hasAnswer(Report const& report)
{
    return report.answer == TopicAnswer::Read;
}

// A list of modules: "id", "name", and what the topic's own object holds.
template <typename Report>
std::string toJson(std::vector<ModuleTopic<Report>> const& modules)
{
    Json list = Json::array();
    for (ModuleTopic<Report> const& module : modules) {
        Json entry = {{"id", fmt::format("{:X}", module.id)}, {"name", textOrNull(module.name)}};
        entry.update(toJsonValue(module.report));
        list.push_back(entry);
    }
    return printed(list);
}

} // namespace velmora
