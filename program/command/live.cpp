#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/live/liverun.h"
#include "program/live/playeddialogue.h"
#include "program/live/playrun.h"
#include "program/terminal/output.h"

#include <velmora/error.h>
#include <velmora/recording.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

// Who waited for a time and saw nothing is told so; who ended it by hand saw it all.
void judgeSilence(CommandCar& car, LiveRun const& run, LiveOptions const& options, bool quiet)
{
    std::vector<std::string> const silent = run.silentSensors();
    if (options.duration > 0.0 && !run.anyValue()) {
        flushOutput();
        run.checkAdapter();
        throw silentVehicle(car, "The vehicle gave none of the chosen values",
                            {"is the ignition on?", "`velmora sensors` lists what the vehicle offers"});
    }
    if (!silent.empty() && run.anyValue() && !quiet) {
        tell(fmt::format("No value came of: {}\n", fmt::join(silent, ", ")));
    }
}

ExitCode playRecording(GlobalOptions const& global, LiveOptions const& options, Recording recording)
{
    PlayRun run(global, options.play, std::move(recording), options.sensors, options.speed);
    run.run();
    return ExitCode::Done;
}

ExitCode readVehicle(GlobalOptions const& global, LiveOptions const& options)
{
    if (!options.rate.empty()) {
        checkRate(options.rate);
    }
    std::unique_ptr<LiveCsv> const csv =
        options.csv.empty() ? nullptr : std::make_unique<LiveCsv>(options.csv, options.force);
    CommandCar car(global);
    LiveRun run(car, options, csv.get());
    run.run();
    if (std::string const troubles = run.signalTroubles(); !troubles.empty() && !global.quiet) {
        tell(troubles);
    }
    judgeSilence(car, run, options, global.quiet);
    return ExitCode::Done;
}

ExitCode live(GlobalOptions const& global, LiveOptions const& options)
{
    if (options.play.empty()) {
        return readVehicle(global, options);
    }
    if (formOf(options.play) != RecordingForm::Dialogue) {
        return playRecording(global, options, readRecording(options.play));
    }
    if (std::optional<Recording> recording = playedDialogue(global, options.play)) {
        return playRecording(global, options, std::move(*recording));
    }
    GlobalOptions replayed = global;
    replayed.port = "replay:" + options.play;
    return readVehicle(replayed, options);
}

} // namespace

void addLiveCommand(CommandLine& commandLine)
{
    auto const options = std::make_shared<LiveOptions>();
    CLI::App* const command = commandLine.addCommand(
        "live", "Show live values", [options](GlobalOptions const& global) { return live(global, *options); });
    command->add_option("SENSOR", options->sensors,
                        "PIDs (0C, 0x0C), names (RPM, COOLANT_TEMP), words of a title, or all;\n"
                        "with a rate (RPM@10hz), of a module (7E9:05);\n"
                        "without: speed, engine speed, coolant, load and throttle");
    command
        ->add_option("--csv", options->csv,
                     "Record there, one column a sensor; - is standard output.\n"
                     "A file that has these columns already is added to")
        ->type_name("FILE");
    command
        ->add_option("--rate", options->rate, "How often to read the sensors that have no rate of their own (RPM@10hz)")
        ->type_name("HZ");
    command->add_flag("--fast", options->fast,
                      "As fast as the bus allows, several PIDs in one request where the modules\n"
                      "can; without the pause that spares them");
    command->add_option("--pids", options->pidsPerRequest, "PIDs in one request at most, with --fast")
        ->type_name("N")
        ->check(CLI::Range(1, 6));
    CLI::Option* const play = command
                                  ->add_option("--play", options->play,
                                               "Play a recording in the place of a vehicle: a database of watch, CSV,\n"
                                               "NDJSON, or a dialogue of record")
                                  ->type_name("FILE")
                                  ->excludes("--csv");
    command->add_option("--speed", options->speed, "How fast to play it, 1 is as it was")
        ->type_name("X")
        ->needs(play)
        ->check(CLI::Range(RecordingPlayer::slowest, RecordingPlayer::fastest));
    command->add_flag("--force", options->force, "Let --csv replace a file that has other columns");
    command->add_option("-n,--count", options->count, "Stop after N readings of every sensor")
        ->type_name("N")
        ->check(CLI::Range(1UL, 1000000000UL));
    command->add_option("--duration", options->duration, "Stop after S seconds")
        ->type_name("S")
        ->check(CLI::Range(0.001, 1e9));
}

} // namespace velmora::cli
