#include "simulator/control/scenario.h"

#include "simulator/control/control.h"
#include "simulator/textfile.h"
#include "simulator/textnumber.h"

#include <sstream>

namespace obdsim {

namespace {

constexpr double longestSeconds = 1e7;
constexpr Time::rep perSecond = 1'000'000;

std::string restOf(std::string const& line)
{
    auto const word = line.find_first_not_of(" \t");
    auto const end = line.find_first_of(" \t", word);
    return end == std::string::npos ? "" : line.substr(end + 1);
}

ScenarioLine parseLine(std::string const& line, Time before)
{
    std::vector<std::string> const words = controlWords(line);
    auto const seconds = parseDecimal(words[0]);
    if (!seconds || *seconds < 0 || *seconds > longestSeconds) {
        failAtWord(words, 0, "the seconds since the beginning");
    }
    Time const time(std::llround(*seconds * static_cast<double>(perSecond)));
    if (time < before) {
        failAtWord(words, 0, "a time that is not before that of the line above");
    }
    ScenarioLine result{time, restOf(line)};
    if (isEmptyControlLine(result.command)) {
        failAtWord(words, 1, "a control command");
    }
    Control::check(result.command);
    return result;
}

} // namespace

std::vector<ScenarioLine> parseScenario(std::string const& text, std::string const& origin)
{
    std::vector<ScenarioLine> lines;
    std::istringstream stream(text);
    int number = 0;
    for (std::string line; std::getline(stream, line);) {
        ++number;
        if (isEmptyControlLine(line)) {
            continue;
        }
        std::string const place = origin + ":" + std::to_string(number);
        try {
            lines.push_back(parseLine(line, lines.empty() ? Time(0) : lines.back().time));
            lines.back().place = place;
        } catch (ControlError const& error) {
            throw ControlError(place + ": " + error.what());
        }
    }
    return lines;
}

std::vector<ScenarioLine> loadScenario(std::string const& path)
{
    auto const text = readTextFile(path);
    if (!text) {
        throw ControlError(path + ": the scenario file cannot be read: " + whyNoText(path));
    }
    return parseScenario(*text, path);
}

std::string formatScenario(std::vector<ScenarioLine> const& lines)
{
    constexpr std::size_t decimals = 6;
    std::string text;
    for (auto const& line : lines) {
        std::string fraction = std::to_string(line.time.count() % perSecond);
        fraction.insert(0, decimals - fraction.size(), '0');
        text += std::to_string(line.time.count() / perSecond) + "." + fraction + " " + line.command + "\n";
    }
    return text;
}

} // namespace obdsim
