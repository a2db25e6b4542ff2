#include "libvelmora/read/vehiclereader.h"
#include "libvelmora/record/dialoguefile.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "libvelmora/record/vinmask.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <obd/isensorservice.h>
#include <velmora/document.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>

namespace velmora::cli {

namespace {

struct RecordOptions
{
    std::string file;
    std::string vehicle;
    bool keepVin = false;
};

// A header of a recording is one line of plain text.
std::string headerText(std::string text, char const* otherwise)
{
    std::replace_if(
        text.begin(), text.end(), [](char each) { return each >= 0 && each < ' '; }, ' ');
    return text.empty() ? otherwise : text;
}

// Each sensor once, so that a replay can serve live values.
void readSensors(Session& session)
{
    auto const service = obd::SensorServiceBuilder::createSensorService();
    for (auto const& ecu : session.selectedModules()) {
        session.select(*ecu);
        for (obd::ParameterIdentifier::Id const id : service->getSupportedIds()) {
            service->fetchSensors(id);
            session.check();
        }
    }
    session.checkAdapter();
}

void save(DialogueRecorder const& recorder, CommandSession const& session, RecordOptions const& chosen,
          DialogueFile& file)
{
    obdsim::Dialogue dialogue = recorder.dialogue();
    if (dialogue.exchanges.empty()) {
        return;
    }
    auto const adapter = session.adapter();
    dialogue.vehicle = headerText(chosen.vehicle, "unknown");
    dialogue.adapter = headerText(adapter != nullptr ? adapter->device() : std::string(), "unknown");
    if (!chosen.keepVin) {
        maskVins(dialogue);
    }
    file.save(dialogue);
    if (!session.options().quiet) {
        tell(fmt::format("Recorded {} requests and commands to {}\n", dialogue.exchanges.size(), chosen.file));
    }
}

ExitCode record(RecordOptions const& chosen, GlobalOptions const& options)
{
    DialogueFile file(chosen.file);
    DialogueRecorder recorder;
    CommandSession session(options);
    session.record(recorder);
    VehicleReport report;
    try {
        session.connect();
        report = readVehicle(session);
        readSensors(session);
    } catch (Error const&) {
        // What went wrong is what one wants to look at later.
        save(recorder, session, chosen, file);
        throw;
    }
    save(recorder, session, chosen, file);
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
    command->add_option("FILE", chosen->file, "File to write, which must not stand yet")->required();
    command->add_option("--vehicle", chosen->vehicle, "What to say of the vehicle in the file")->type_name("TEXT");
    command->add_flag("--keep-vin", chosen->keepVin,
                      "Keep the whole vehicle identification number; otherwise its last six characters become 0");
}

} // namespace velmora::cli
