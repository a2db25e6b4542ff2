#include "libvelmora/read/routinereader.h"
#include "libvelmora/text/text.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/command/confirm.h"
#include "program/command/modulecommand.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/layout.h"

#include <algorithm>

namespace velmora::cli {

namespace {

struct Candidate
{
    std::shared_ptr<obd::IEcu> ecu;
    Routine routine;
};

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
    return showTopic(options, readRoutines,
                     {ErrorKind::NotSupported,
                      "No control module offers a routine that is known here",
                      {"many vehicles have none"}});
}

// The first of the selected modules that offers the routine. What a routine does that the library does not know, nobody
// can be warned of; it is not run.
Candidate find(Session& session, unsigned char id)
{
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        for (Routine const& routine : readRoutines(session, *ecu).routines) {
            if (routine.id == id) {
                return {ecu, routine};
            }
        }
    }
    throw Error(ErrorKind::NotSupported, fmt::format("No control module offers a known routine {}", routineId(id)),
                {"`velmora routines` lists those that can be run"});
}

std::string routineWarning(Candidate const& candidate)
{
    return fmt::format(
        "This asks control module {:X} {} to run routine {}: {}\n{}"
        "The routine acts on the vehicle. Have it parked safely, with nobody near moving or hot parts.\n",
        candidate.ecu->id(), candidate.ecu->name(), routineId(candidate.routine.id), candidate.routine.name,
        wrapped(candidate.routine.description, 76, "  "));
}

ExitCode judge(RoutineRun const& run)
{
    switch (run.result) {
    case RoutineRun::Result::Refused:
        throw Error(ErrorKind::Refused,
                    fmt::format("The vehicle refused to run routine {}{}{}", routineId(run.routine.id),
                                run.reason.empty() ? "" : ": ", run.reason),
                    {"the vehicle decides when a routine may run; its maker's documents tell the conditions"});
    case RoutineRun::Result::NoAnswer:
        throw Error(ErrorKind::VehicleSilent,
                    fmt::format("The vehicle did not say whether it runs routine {}", routineId(run.routine.id)),
                    {"is the ignition still on?", "it may run all the same"});
    case RoutineRun::Result::Accepted:
        break;
    }
    return ExitCode::Done;
}

ExitCode run(std::string const& text, GlobalOptions const& options)
{
    unsigned char const id = parseRoutineId(text);
    requireConsent(options, "Running a routine", "runs it without asking");
    CommandSession session(options);
    session.connect();
    Candidate const candidate = find(session, id);
    if (!confirmed(session, routineWarning(candidate), "Run now?")) {
        tell("Nothing was run.\n");
        return ExitCode::Failed;
    }
    RoutineRun const outcome = runRoutine(session, *candidate.ecu, candidate.routine);
    print(std::vector<ModuleTopic<RoutineRun>>{{candidate.ecu->id(), candidate.ecu->name(), outcome}}, options);
    return judge(outcome);
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
