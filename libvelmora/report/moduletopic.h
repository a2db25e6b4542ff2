#pragma once

#include "libvelmora/report/json.h"

#include <fmt/format.h>

#include <algorithm>
#include <concepts>
#include <string>
#include <vector>

namespace velmora {

// Whether a control module told of a topic.
enum class TopicAnswer
{
    Read,
    NotOffered, // by what the module says it supports, so that it was not asked
    Silent,
    Unreadable, // it answered in a form that can't be decoded
};

// "read", "not supported", "no answer" or "unreadable".
char const* answerWord(TopicAnswer answer);

// What one control module told of one topic. For each Report there are toJsonValue(Report), an object, and
// hasAnswer(Report), whether it holds anything.
template <typename Report>
struct ModuleTopic
{
    unsigned int id;
    std::string name;
    Report report;
};

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
