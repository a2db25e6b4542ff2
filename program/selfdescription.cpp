#include "program/selfdescription.h"

#include "common/text/text.h"
#include "program/terminal/output.h"
#include "simulator/simulation.h"
#include "tools/manual/completion.h"
#include "tools/manual/manualpage.h"

#include <velmora/catalogue.h>
#include <velmora/longwatch.h>
#include <velmora/offers.h>
#include <velmora/ports.h>
#include <velmora/settingsfile.h>
#include <velmora/version.h>

#include <fmt/format.h>

#include <string>
#include <string_view>
#include <vector>

namespace velmora::cli {

namespace {

using manual::Completion;

Completion ports(std::string const& /*begun*/)
{
    Completion completion;
    for (SerialPortEntry const& port : serialPorts()) {
        completion.candidates.push_back({port.device, port.description});
    }
    completion.candidates.push_back({"auto", "Look for an adapter"});
    for (std::string const& vehicle : obdsim::simulatedVehicles()) {
        completion.candidates.push_back({"sim:" + vehicle, "Simulated vehicle"});
    }
    return completion;
}

Completion names(std::vector<std::string> const& words)
{
    Completion completion;
    for (std::string const& word : words) {
        completion.candidates.push_back({word, {}});
    }
    return completion;
}

// Also behind a control module: "7E9:RPM".
Completion sensors(std::string const& begun)
{
    std::string const module = begun.substr(0, begun.rfind(':') + 1);
    Completion completion;
    for (auto const& list : {sensorNames(), sensorAliases()}) {
        for (SensorName const& each : list) {
            completion.candidates.push_back({module + each.name, fmt::format("PID {:02X}", each.pid)});
        }
    }
    completion.candidates.push_back({module + "all", "All that a control module offers"});
    return completion;
}

// The whole catalogue is too much to look at: only from a letter and two digits on.
Completion troubleCodes(std::string const& begun)
{
    Completion completion;
    if (begun.size() < 3) {
        return completion;
    }
    std::string const wanted = toUpper(begun);
    std::string last;
    for (CatalogueRow const& row : findRows({wanted})) {
        if (row.code.starts_with(wanted) && row.code != last) {
            completion.candidates.push_back({row.code, row.text});
            last = row.code;
        }
    }
    return completion;
}

// Those of the vehicle, and a limit for each sensor.
Completion settingNames(std::string const& /*begun*/)
{
    Completion completion;
    for (SettingsFile::Setting const& each : SettingsFile().settings()) {
        completion.candidates.push_back({each.name, each.title});
    }
    for (SensorName const& each : sensorNames()) {
        completion.candidates.push_back({fmt::format("limit.{}", each.name), "What its values should stay in"});
    }
    return completion;
}

// What addresses of the outputs of this build begin with.
Completion outputs(std::string const& /*begun*/)
{
    std::vector<std::string> words;
    for (std::string const& each : builtInOutputs()) {
        words.push_back(each + (each.starts_with("mqtt") ? "://" : ":"));
    }
#ifdef VELMORA_DASH
    words.emplace_back("dash:");
#endif
    return names(words);
}

Completion files(std::string const& /*begun*/)
{
    Completion completion;
    completion.files = true;
    return completion;
}

manual::Sources sources()
{
    auto const fixed = [](std::vector<std::string> words) {
        return [words = std::move(words)](std::string const& /*begun*/) { return names(words); };
    };
    auto const vehicles = [](std::string const& /*begun*/) { return names(obdsim::simulatedVehicles()); };
    auto const adapters = [](std::string const& /*begun*/) { return names(obdsim::simulatedAdapters()); };
    auto const drives = [](std::string const& /*begun*/) { return names(obdsim::simulatedDrives()); };
    auto const makers = [](std::string const& /*begun*/) { return names(catalogueMakers()); };
    return {{"PORT", ports},
            {"SENSOR", sensors},
            {"CODE", troubleCodes},
            {"MAKER", makers},
            {"SYSTEM", fixed({"metric", "imperial", "imperial-uk"})},
            {"WHEN", fixed({"auto", "always", "never"})},
            {"KIND:TARGET", outputs},
            {"SETTING", settingNames},
            {"RULE", fixed({"us-epa", "us-california", "uk-mot", "de-au", "none"})},
            {"ADDRESS", fixed({"pty", "tcp://127.0.0.1:0"})},
            {"VEHICLE", vehicles},
            {"--adapter", adapters},
            {"--drive", drives},
            {"--scenario", files},
            {"--replay", files},
            {"--bundle", files},
            {"DB", files},
            {"FILE", files}};
}

} // namespace

std::optional<ExitCode> describeItself(CLI::App const& app, int argc, char const* const* argv)
{
    std::string_view const wish = argc > 1 ? argv[1] : "";
    if (wish == "__manual" && argc == 3) {
        manual::writeManual(argv[2], manual::describe(app), {versionText, manual::manualDate(), {}});
        return ExitCode::Done;
    }
    if (wish == "__complete") {
        std::vector<std::string> const words(argv + 2, argv + argc);
        writeOutput(manual::printed(manual::complete(manual::describe(app), sources(), words)));
        return ExitCode::Done;
    }
    return std::nullopt;
}

} // namespace velmora::cli
