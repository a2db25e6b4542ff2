#include "libvelmora/doctor/doctor.h"

#include "libvelmora/record/checkedfile.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstring>
#include <filesystem>
#include <fstream>

namespace velmora::cli {

namespace {

struct DoctorOptions
{
    std::string bundle;
    bool keepVin = false;
    bool force = false;
};

// What can be told before a minute is spent with the vehicle.
void checkBundle(DoctorOptions const& chosen)
{
    std::error_code error;
    if (chosen.bundle.empty()) {
        return;
    }
    if (!chosen.force && std::filesystem::exists(chosen.bundle, error)) {
        throw Error(ErrorKind::WrongUse, "The file " + chosen.bundle + " stands already",
                    {"--force replaces it", "write to another name"});
    }
    requireWritable(chosen.bundle, "bundle");
}

void save(std::string const& file, std::string const& text)
{
    std::ofstream out(file, std::ios::binary);
    out << text << std::flush;
    if (!out) {
        throw Error(ErrorKind::Failed, "Could not write " + file + ": " + std::strerror(errno),
                    {"is there a folder of that name, and room on the disk?"});
    }
}

ExitCode examineChain(DoctorOptions const& chosen, GlobalOptions const& options)
{
    checkBundle(chosen);
    CommandSession session(options);
    DialogueRecorder recorder;
    DoctorReport const report = examine(session, recorder);
    if (options.json) {
        writeOutput(printed(toJson(report)));
    } else {
        printText(toText(report));
        flushOutput();
    }
    if (!chosen.bundle.empty()) {
        save(chosen.bundle, makeBundle(report, session, recorder, chosen.keepVin));
    }
    return report.isHealthy() ? ExitCode::Done : ExitCode::Failed;
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
