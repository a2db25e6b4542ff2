#include "libvelmora/doctor/doctor.h"

#include "libvelmora/doctor/adaptercheck.h"
#include "libvelmora/doctor/portcheck.h"
#include "libvelmora/doctor/vehiclecheck.h"
#include "libvelmora/port/opening/openport.h"
#include "libvelmora/port/recordedport.h"
#include "libvelmora/record/macmask.h"
#include "libvelmora/record/vinmask.h"

#include <velmora/error.h>
#include <velmora/version.h>

#include <fmt/format.h>

#include <fstream>
#include <sys/utsname.h>

namespace velmora {

namespace {

using Verdict = DoctorCheck::Verdict;

std::unique_ptr<AdapterTalk> openTalk(Session const& session, PortAddress const& address, DialogueRecorder& recorder)
{
    return std::make_unique<AdapterTalk>(std::make_unique<RecordedPort>(openPort(address), recorder),
                                         [&session] { session.check(); });
}

bool examineAdapter(Session const& session, PortAddress const& address, DialogueRecorder& recorder,
                    DoctorReport& report)
{
    try {
        return checkAdapter(*openTalk(session, address, recorder), report);
    } catch (Error const& error) {
        if (error.kind() == ErrorKind::Interrupted) {
            throw;
        }
        report.checks.push_back(
            {"port", Verdict::Bad, error.what(), error.hints().empty() ? std::string() : error.hints().front()});
        return false;
    }
}

// Which link of the chain an error tells of.
char const* linkOf(Error const& error)
{
    switch (error.kind()) {
    case ErrorKind::PortFailed:
    case ErrorKind::LinkLost:
        return "port";
    case ErrorKind::AdapterSilent:
        return "adapter";
    default:
        return "bus";
    }
}

// Interrupting the examination ends it; whatever else goes wrong is a finding.
void noteFailure(Error const& error, DoctorReport& report)
{
    if (error.kind() == ErrorKind::Interrupted) {
        throw error;
    }
    report.checks.push_back(
        {linkOf(error), Verdict::Bad, error.what(), error.hints().empty() ? std::string() : error.hints().front()});
}

// What can't be read by name may hold a secret, so only harmless lines are kept.
std::string harmlessSettings(std::filesystem::path const& file)
{
    std::ifstream in(file);
    std::string text;
    for (std::string line; std::getline(in, line);) {
        bool secret = false;
        for (char const* word : {"pass", "secret", "token", "key", "user", "host", "url", "://", "mac"}) {
            secret = secret || line.find(word) != std::string::npos;
        }
        text += secret ? "(left out)\n" : line + "\n";
    }
    return text.empty() ? "(none)\n" : text;
}

std::string systemText()
{
    utsname system = {};
    ::uname(&system);
    return fmt::format("{} {} {}", system.sysname, system.release, system.machine);
}

} // namespace

DoctorReport examine(Session& session, DialogueRecorder& recorder)
{
    DoctorReport report;
    PortAddress const address = session.findPort();
    report.checks = checkPort(address);
    if (!report.isHealthy() || !examineAdapter(session, address, recorder, report)) {
        return report;
    }
    session.check();
    session.record(recorder);
    try {
        session.connect();
    } catch (Error const& error) {
        noteFailure(error, report);
        noteHabits(session, report);
        session.disconnect();
        if (error.kind() == ErrorKind::VehicleSilent) {
            checkBuses(*openTalk(session, address, recorder), report);
        }
        return report;
    }
    try {
        checkVehicle(session, report);
    } catch (Error const& error) {
        noteFailure(error, report);
    }
    noteHabits(session, report);
    return report;
}

std::string makeBundle(DoctorReport const& report, Session const& session, DialogueRecorder const& recorder,
                       bool keepVin)
{
    obdsim::Dialogue dialogue = recorder.dialogue();
    dialogue.vehicle = "unknown";
    dialogue.adapter = session.adapter() != nullptr ? session.adapter()->device() : "unknown";
    if (!keepVin) {
        maskVins(dialogue);
    }
    return withoutMacs(fmt::format("Velmora {} on {}\n\n{}\nSettings\n\n{}\nDialogue\n\n{}", versionText, systemText(),
                                   toText(report), harmlessSettings(session.settingsFile()),
                                   obdsim::formatDialogue(dialogue)));
}

} // namespace velmora
