#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/document.h>
#include <velmora/recorder.h>

#include <fmt/format.h>

#include <memory>

namespace velmora::cli {

namespace {

struct RecordOptions
{
    std::string file;
    std::string vehicle;
    bool keepVin = false;
};

void save(Recorder& recorder, RecordOptions const& chosen, GlobalOptions const& options)
{
    std::size_t const recorded = recorder.save(chosen.vehicle, chosen.keepVin);
    if (recorded != 0 && !options.quiet) {
        tell(fmt::format("Recorded {} requests and commands to {}\n", recorded, chosen.file));
    }
}

VehicleReport readAll(GlobalOptions const& options, std::shared_ptr<Recorder> const& recorder)
{
    CommandCar car(options, recorder);
    VehicleReport report = car.report();
    car.askSensors();
    return report;
}

ExitCode record(RecordOptions const& chosen, GlobalOptions const& options)
{
    auto const recorder = std::make_shared<Recorder>(chosen.file);
    VehicleReport report;
    try {
        report = readAll(options, recorder);
    } catch (Error const&) {
        // What went wrong is what one wants to look at later.
        save(*recorder, chosen, options);
        throw;
    }
    save(*recorder, chosen, options);
    if (options.json) {
        fmt::print("{}", report.toJson());
    } else {
        printText(toText(report, DocumentOptions(), textStyle(options)));
    }
    return ExitCode::Done;
}

} // namespace

void addRecordCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<RecordOptions>();
    CLI::App* const command =
        commandLine.addCommand("record", "Make the report of scan and save the dialogue for replay:FILE",
                               [chosen](GlobalOptions const& options) { return record(*chosen, options); });
    command->add_option("FILE", chosen->file, "File to write once the connection is closed; it must not stand yet")
        ->required();
    command->add_option("--vehicle", chosen->vehicle, "What to say of the vehicle in the file")->type_name("WORDS");
    command->add_flag("--keep-vin", chosen->keepVin,
                      "Keep the whole vehicle identification number; otherwise its last six characters become 0");
}

} // namespace velmora::cli
