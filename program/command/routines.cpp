#include "common/text/layout.h"
#include "common/text/text.h"
#include "program/command/commands.h"
#include "program/command/confirm.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/style.h"

#include <algorithm>

namespace velmora::cli {

namespace {

unsigned char parseRoutineId(std::string const& text)
{
    std::optional<unsigned int> const id = parseHex(text, 0xFF);
    if (!id) {
        throw Error(ErrorKind::WrongUse, "\"" + text + "\" is no routine",
                    {"expected a hexadecimal number from 00 to FF; `velmora routines` lists them"});
    }
    return static_cast<unsigned char>(*id);
}

ExitCode list(GlobalOptions const& options)
{
    return showTopic(options, &Car::routines,
                     {ErrorKind::NotSupported,
                      "No control module offers a routine that is known here",
                      {"many vehicles have none"}});
}

std::string routineWarning(ModuleTopic<Routine> const& choice, GlobalOptions const& options)
{
    return fmt::format(
        "This asks control module {:X} {} to run routine {:02X}: {}\n{}"
        "The routine acts on the vehicle. Have it parked safely, with nobody near moving or hot parts.\n",
        choice.id, choice.name, choice.report.id, choice.report.name,
        wrapped(choice.report.description, 76, "  ", outputStyle(options)));
}

void printRun(ModuleTopic<RoutineRun> const& run, GlobalOptions const& options)
{
    if (options.json) {
        fmt::print("{}", toJson(run));
    } else {
        printText(toText(run, textStyle(options)));
    }
    flushOutput();
}

ExitCode run(std::string const& text, GlobalOptions const& options)
{
    unsigned char const id = parseRoutineId(text);
    requireConsent(options, "Running a routine", "runs it without asking");
    CommandCar car(options);
    if (!confirmed(car, routineWarning(car.findRoutine(id), options), "Run now?")) {
        tell("Nothing was run.\n");
        return ExitCode::Failed;
    }
    ModuleTopic<RoutineRun> const outcome = car.tryRoutine(id);
    printRun(outcome, options);
    requireAccepted(outcome.report);
    return ExitCode::Done;
}

} // namespace

void addRoutinesCommand(CommandLine& commandLine)
{
    auto const id = std::make_shared<std::string>();
    CLI::App* const command = commandLine.addCommand(
        "routines", "List on-board test routines, or run one; asks first",
        [id](GlobalOptions const& options) { return id->empty() ? list(options) : run(*id, options); });
    command->add_option("--run", *id, "Number of the routine, hexadecimal")->type_name("ID");
}

} // namespace velmora::cli
