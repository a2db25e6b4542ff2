#include "libvelmora/read/sensorchoice.h"

#include "common/text/text.h"
#include "libvelmora/read/sensornames.h"

#include <obd/parameterdescriptor.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <charconv>
#include <memory>
#include <optional>
#include <string_view>

namespace velmora {

namespace {

using Id = obd::ParameterIdentifier::Id;
using Offered = std::vector<OfferedSensor>;

constexpr int usualPids[] = {0x0D, 0x0C, 0x05, 0x04, 0x11};
constexpr char const* listHint = "`velmora sensors` lists what the vehicle offers";

Id toId(int pid)
{
    return obd::ParameterIdentifier(pid).id();
}

bool isOffered(Id id, Offered const& offered)
{
    return std::any_of(offered.begin(), offered.end(), [id](OfferedSensor const& each) { return each.id == id; });
}

// One or two digits behind "$" or "0x"; without, two, or four if the first two are the service's.
std::optional<int> parsePid(std::string const& text)
{
    std::string_view digits = text;
    bool const dollar = digits.starts_with('$');
    bool const prefixed = dollar || digits.starts_with("0x") || digits.starts_with("0X");
    if (prefixed) {
        digits.remove_prefix(dollar ? 1 : 2);
    }
    if (digits.size() == 4 && digits.starts_with("01")) {
        digits.remove_prefix(2);
    }
    int pid = 0;
    char const* const last = std::to_address(digits.end());
    auto const [end, error] = std::from_chars(std::to_address(digits.begin()), last, pid, 16);
    bool const whole = error == std::errc() && end == last && digits.front() != '-';
    bool const length = digits.size() == 2 || (prefixed && digits.size() == 1);
    return whole && length ? std::optional(pid) : std::nullopt;
}

std::string describe(OfferedSensor const& sensor)
{
    std::string const name = sensorNameOf(sensor.id);
    return fmt::format("{:02X}{}{}  {}", static_cast<int>(sensor.id), name.empty() ? "" : " ", name, sensor.title);
}

bool hasWords(std::string const& title, std::vector<std::string> const& words)
{
    std::string const whole = toUpper(title);
    return std::all_of(words.begin(), words.end(),
                       [&whole](std::string const& word) { return whole.find(toUpper(word)) != std::string::npos; });
}

Offered findTitles(std::string const& text, Offered const& offered)
{
    Offered whole;
    Offered partly;
    std::vector<std::string> const words = splitWords(text);
    for (OfferedSensor const& each : offered) {
        if (toUpper(each.title) == toUpper(text)) {
            whole.push_back(each);
        }
        if (!words.empty() && hasWords(each.title, words)) {
            partly.push_back(each);
        }
    }
    return whole.empty() ? partly : whole;
}

[[noreturn]] void failUnclear(std::string const& text, Offered const& candidates)
{
    std::vector<std::string> hints;
    for (OfferedSensor const& each : candidates) {
        hints.push_back(describe(each));
    }
    throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" may mean {} sensors; say which:", text, candidates.size()),
                hints);
}

// Some names that people know are of no sensor, but have a command of their own.
char const* betterCommand(int pid)
{
    switch (pid) {
    case 0x01:
    case 0x41:
        return "`velmora readiness` shows lamp and monitors";
    case 0x02:
        return "`velmora freeze` shows the code that froze values, and the values";
    default:
        return listHint;
    }
}

[[noreturn]] void failNotOffered(int pid, Offered const& alike)
{
    std::string const name = sensorNameOf(pid);
    std::vector<std::string> hints;
    for (OfferedSensor const& each : alike) {
        hints.push_back(fmt::format("or is this meant? {}", describe(each)));
    }
    hints.insert(hints.end(), {betterCommand(pid), "another control module may offer it: --ecu ID"});
    throw Error(ErrorKind::NotSupported,
                fmt::format("The vehicle does not offer the sensor {:02X}{}", pid,
                            name.empty() ? "" : fmt::format(" ({})", name)),
                hints);
}

// A name of several words means one sensor, and so does one that came from another program's users: where the vehicle
// lacks it, another whose title has the same words would give values of something else. A single word, such as "fuel",
// is what people look for in titles, too.
bool isLoose(std::string const& name)
{
    return splitWords(name).size() == 1 &&
           std::any_of(sensorNames().begin(), sensorNames().end(),
                       [&name](SensorName const& each) { return toUpper(name) == each.name; });
}

[[noreturn]] void failUnknown(std::string const& text)
{
    std::vector<std::string> hints;
    std::size_t const near = text.size() < 3 ? 1 : 2;
    for (SensorName const& each : sensorNames()) {
        if (editDistance(toUpper(text), each.name) <= near) {
            hints.push_back(fmt::format("did you mean {} ({:02X})?", each.name, each.pid));
        }
    }
    hints.emplace_back(listHint);
    hints.emplace_back("a sensor is named by its PID (0C), its name (RPM) or words of its title (coolant)");
    throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no sensor that is known", text), hints);
}

Id chooseOne(std::string const& text, Offered const& offered)
{
    std::optional<int> known = parsePid(text);
    bool const isPid = known.has_value();
    if (!isPid) {
        known = findSensorName(text);
    }
    if (known && isOffered(toId(*known), offered)) {
        return toId(*known);
    }
    Offered const titles = isPid ? Offered() : findTitles(text, offered);
    if (known && !isLoose(text)) {
        failNotOffered(*known, titles);
    }
    if (titles.size() == 1) {
        return titles.front().id;
    }
    if (!titles.empty()) {
        failUnclear(text, titles);
    }
    if (known) {
        failNotOffered(*known, titles);
    }
    failUnknown(text);
}

SensorIds usualSensors(Offered const& offered)
{
    SensorIds ids;
    for (int const pid : usualPids) {
        if (isOffered(toId(pid), offered)) {
            ids.push_back(toId(pid));
        }
    }
    if (ids.empty() && !offered.empty()) {
        ids.push_back(offered.front().id);
    }
    return ids;
}

} // namespace

std::vector<OfferedSensor> offeredSensors(obd::ISensorService& service)
{
    Offered offered;
    for (auto const& descriptor : service.getDescriptors()) {
        offered.push_back({descriptor->pid(), descriptor->description()});
    }
    return offered;
}

SensorIds chooseSensors(std::vector<std::string> const& words, Offered const& offered)
{
    if (offered.empty()) {
        throw Error(ErrorKind::NotSupported, "The control module offers no sensor",
                    {"another one may: --ecu ID; `velmora scan` lists them"});
    }
    if (words.empty()) {
        return usualSensors(offered);
    }
    SensorIds ids;
    auto const add = [&ids](Id id) {
        if (std::find(ids.begin(), ids.end(), id) == ids.end()) {
            ids.push_back(id);
        }
    };
    for (std::string const& word : words) {
        if (toUpper(word) == "ALL") {
            std::for_each(offered.begin(), offered.end(), [&add](OfferedSensor const& each) { add(each.id); });
        } else {
            add(chooseOne(word, offered));
        }
    }
    return ids;
}

} // namespace velmora
