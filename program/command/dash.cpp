#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/live/playeddialogue.h"
#include "program/watch/dashplay.h"
#include "program/watch/watchcommand.h"

#include <velmora/longwatch.h>
#include <velmora/recording.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

struct DashOptions
{
    std::string listen = "127.0.0.1:8722";
    bool allowClear = false;
    bool allowConsole = false;
    std::vector<std::string> names;
    std::string play; // a recording in the place of a vehicle
    double speed = 1.0;
    WatchOptions watch;
};

// A watch with the page as its output. Whoever looks at the page wants to see a car with its engine off, too.
ExitCode dash(GlobalOptions const& given, DashOptions const& chosen)
{
    GlobalOptions global = given;
    checkPagePlace(chosen.listen);
    WatchOptions watch = chosen.watch;
    std::string address = fmt::format("dash:{}?allow_clear={}&allow_console={}", chosen.listen,
                                      chosen.allowClear ? "yes" : "no", chosen.allowConsole ? "yes" : "no");
    if (!chosen.names.empty()) {
        address += fmt::format("&name={}", fmt::join(chosen.names, ","));
    }
    if (!chosen.play.empty()) {
        bool const dialogue = formOf(chosen.play) == RecordingForm::Dialogue;
        std::optional<Recording> const recording =
            dialogue ? playedDialogue(global, chosen.play) : std::optional(readRecording(chosen.play));
        if (recording) {
            return playOnPage(global, address, *recording, chosen.speed);
        }
        global.port = "replay:" + chosen.play; // read as a vehicle
    }
    watch.outputs.insert(watch.outputs.begin(), address);
    watch.page = true;
    // Where no other output needs a name for it, any vehicle may come to the page.
    if (watch.vehicle.empty() && chosen.watch.outputs.empty() && watch.config.empty()) {
        watch.vehicle = "car";
    }
    if (watch.stopAfter.empty() && watch.config.empty()) {
        watch.stopAfter = "1h";
    }
    return runWatch(global, watch);
}

} // namespace

void addDashCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<DashOptions>();
    CLI::App* const command =
        commandLine.addCommand("dash", "Show the car in a browser: gauges, chart, codes, readiness and more",
                               [chosen](GlobalOptions const& global) { return dash(global, *chosen); });
    command
        ->add_option("--listen", chosen->listen,
                     "Where the page is (127.0.0.1:8722). Beyond this machine, such as\n"
                     "0.0.0.0:8722, a browser needs the link with the token that is told; whoever is\n"
                     "in the network can read along, and a phone's screen can't be kept on")
        ->type_name("HOST:PORT");
    CLI::Option* const play = command
                                  ->add_option("--play", chosen->play,
                                               "Play a recording in the place of a vehicle: a database of watch, CSV,\n"
                                               "NDJSON, or a dialogue of record")
                                  ->type_name("FILE");
    command->add_option("--speed", chosen->speed, "How fast to play it, 1 is as it was")
        ->type_name("X")
        ->needs(play)
        ->check(CLI::Range(RecordingPlayer::slowest, RecordingPlayer::fastest));
    command->add_flag("--allow-clear", chosen->allowClear, "Let the page clear trouble codes; needs the token");
    command->add_flag("--allow-console", chosen->allowConsole,
                      "Let the page talk to the adapter, which may upset the dialogue; needs the token");
    command->add_option("--name", chosen->names, "A further name of this machine that browsers may use")
        ->type_name("NAME")
        ->allow_extra_args(false);
    addWatchOptions(*command, chosen->watch);
}

} // namespace velmora::cli
