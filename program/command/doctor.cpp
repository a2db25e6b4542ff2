#include "program/command/commandcar.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"

#include <velmora/doctor.h>

#include <memory>
#include <string>

namespace velmora::cli {

namespace {

struct DoctorOptions
{
    std::string bundle;
    bool keepVin = false;
    bool force = false;
};

ExitCode examineChain(DoctorOptions const& chosen, GlobalOptions const& options)
{
    if (!chosen.bundle.empty()) {
        Doctor::checkBundle(chosen.bundle, chosen.force);
    }
    InterruptStop const stop;
    Doctor const doctor(carOptions(options, stop.token()));
    if (options.json) {
        writeOutput(doctor.toJson());
    } else {
        printText(doctor.toText());
        flushOutput();
    }
    if (!chosen.bundle.empty()) {
        doctor.saveBundle(chosen.bundle, chosen.keepVin);
    }
    return doctor.isHealthy() ? ExitCode::Done : ExitCode::Failed;
}

} // namespace

void addDoctorCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<DoctorOptions>();
    CLI::App* const command = commandLine.addCommand(
        "doctor", "Walk from the port to the modules: which link is dead or slow, and what to do",
        [chosen](GlobalOptions const& options) { return examineChain(*chosen, options); });
    command->add_option("--bundle", chosen->bundle, "Write all of it to one text file, to attach to a question")
        ->type_name("FILE");
    command->add_flag("--force", chosen->force, "Let --bundle replace a file");
    command->add_flag("--keep-vin", chosen->keepVin,
                      "Keep the whole vehicle identification number in it; otherwise its last six characters become 0");
}

} // namespace velmora::cli
