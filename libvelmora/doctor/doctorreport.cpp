#include "libvelmora/doctor/doctorreport.h"

#include <fmt/format.h>
#include <fmt/ranges.h>

#include <algorithm>

namespace velmora {

namespace {

using Verdict = DoctorCheck::Verdict;

char const* mark(Verdict verdict)
{
    return verdict == Verdict::Good ? "ok" : verdict == Verdict::Note ? "note" : "FAILS";
}

auto firstBad(DoctorReport const& report)
{
    return std::find_if(report.checks.begin(), report.checks.end(),
                        [](DoctorCheck const& each) { return each.verdict == Verdict::Bad; });
}

std::string toText(DoctorFigures const& figures)
{
    std::string text = fmt::format("Reply after {:.0f} ms at least, {:.0f} in the middle, {:.0f} for 95 %, {:.0f} at "
                                   "most ({} requests)\n",
                                   figures.minimum, figures.median, figures.high, figures.maximum, figures.requests);
    text += fmt::format("Longest reply that came whole: {} bytes\n", figures.longestReply);
    text += fmt::format("Expected-count digit: {}\n", !figures.countWorks   ? "not tried"
                                                      : *figures.countWorks ? "makes replies faster"
                                                                            : "no gain, or refused");
    text += fmt::format("PIDs in one request: {}\n", figures.pidsPerRequest);
    text += fmt::format("Within reach: about {:.0f} values a second\n", figures.valuesPerSecond);
    return text;
}

} // namespace

bool DoctorReport::isHealthy() const
{
    return firstBad(*this) == checks.end();
}

std::string DoctorReport::verdict() const
{
    auto const bad = firstBad(*this);
    if (bad != checks.end()) {
        std::string const end = bad->advice.ends_with('?') ? "" : ".";
        return fmt::format("The {} is where it breaks: {}{}{}{}", bad->link, bad->finding,
                           bad->advice.empty() ? "" : "; ", bad->advice, end);
    }
    return figures ? fmt::format("Everything works from the port to the control modules; about {:.0f} values a second "
                                 "are within reach.",
                                 figures->valuesPerSecond)
                   : "Nothing dead was found, but no control module was measured.";
}

std::string toText(DoctorReport const& report)
{
    std::string text;
    for (DoctorCheck const& check : report.checks) {
        text += fmt::format("{:<5}  {:<9}  {}\n", mark(check.verdict), check.link, check.finding);
        if (!check.advice.empty()) {
            text += fmt::format("{:18}{}\n", "", check.advice);
        }
    }
    if (!report.missing.empty()) {
        text += fmt::format("Commands that are missing: {}\n", fmt::join(report.missing, ", "));
    }
    for (auto const& [habit, times] : report.habits) {
        text += fmt::format("Met on the way: {}, {}x\n", habit, times);
    }
    if (report.figures) {
        text += "\n" + toText(*report.figures);
    }
    return text + "\n" + report.verdict() + "\n";
}

Json toJson(DoctorReport const& report)
{
    Json checks = Json::array();
    for (DoctorCheck const& check : report.checks) {
        char const* const verdict = check.verdict == Verdict::Good   ? "good"
                                    : check.verdict == Verdict::Note ? "note"
                                                                     : "bad";
        checks.push_back({{"link", check.link},
                          {"verdict", verdict},
                          {"finding", check.finding},
                          {"advice", textOrNull(check.advice)}});
    }
    Json habits = Json::array();
    for (auto const& [habit, times] : report.habits) {
        habits.push_back({{"habit", habit}, {"times", times}});
    }
    Json json = {{"checks", checks},
                 {"missing", report.missing},
                 {"habits", habits},
                 {"figures", nullptr},
                 {"verdict", report.verdict()}};
    if (report.figures) {
        DoctorFigures const& figures = *report.figures;
        json["figures"] = {{"requests", figures.requests},
                           {"minimum", figures.minimum},
                           {"median", figures.median},
                           {"high", figures.high},
                           {"maximum", figures.maximum},
                           {"longestReply", figures.longestReply},
                           {"countWorks", valueOrNull(figures.countWorks)},
                           {"pidsPerRequest", figures.pidsPerRequest},
                           {"valuesPerSecond", figures.valuesPerSecond}};
    }
    return json;
}

} // namespace velmora
