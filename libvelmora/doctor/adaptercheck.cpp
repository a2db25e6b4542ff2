#include "libvelmora/doctor/adaptercheck.h"

#include "libvelmora/doctor/commandmatrix.h"

#include <fmt/format.h>

#include <charconv>

namespace velmora {

namespace {

using std::chrono::milliseconds;
using Verdict = DoctorCheck::Verdict;

constexpr milliseconds answerLimit{2000};
constexpr milliseconds commandLimit{300};
constexpr milliseconds searchLimit{10000};
constexpr double engineRuns = 13.2; // V and more: the alternator charges
constexpr double weak = 12.0;       // V and less, at rest
constexpr double none = 6.0;

constexpr char const* buses[] = {"SAE J1850 PWM",          "SAE J1850 VPW",          "ISO 9141-2",
                                 "ISO 14230-4, 5 baud",    "ISO 14230-4, fast",      "CAN 11 bit, 500 kbit/s",
                                 "CAN 29 bit, 500 kbit/s", "CAN 11 bit, 250 kbit/s", "CAN 29 bit, 250 kbit/s"};

void judgeMatrix(CommandMatrix const& matrix, bool isStn, DoctorReport& report)
{
    if (matrix.agreesToAll) {
        report.checks.push_back({"adapter", Verdict::Note, "says OK to a command that does not exist",
                                 "a clone: what it claims to know proves nothing"});
        return;
    }
    if (matrix.claimIsMadeUp && !isStn) {
        report.checks.push_back({"adapter", Verdict::Note,
                                 fmt::format("v{} is a version that its maker never made; it knows the commands of v{}",
                                             matrix.claimed, matrix.level.empty() ? "1.0 in part" : matrix.level),
                                 ""});
    }
    if (!matrix.missing.empty()) {
        report.checks.push_back({"adapter", Verdict::Note,
                                 fmt::format("lacks {} of the commands that it should know", matrix.missing.size()),
                                 "a clone; most of them are not needed"});
    }
    report.missing = matrix.missing;
}

} // namespace

std::optional<DoctorCheck> judgeVoltage(std::string const& reply)
{
    double volts = 0.0;
    auto const [end, error] = std::from_chars(reply.data(), reply.data() + reply.size(), volts);
    if (error != std::errc() || end == reply.data()) {
        return std::nullopt;
    }
    std::string const text = fmt::format("{:.1f} V at the socket", volts);
    if (volts < none) {
        return DoctorCheck{"voltage", Verdict::Bad, text + ", which is none",
                           "is the adapter firmly in the car's socket?"};
    }
    if (volts <= weak) {
        return DoctorCheck{"voltage", Verdict::Note, text + ": a weak battery, or a board that reads low",
                           "charge it before a long session with the engine off"};
    }
    return DoctorCheck{
        "voltage", Verdict::Good,
        text + (volts >= engineRuns ? ": the battery is charged, the engine runs" : ": the engine is off"), ""};
}

std::optional<DoctorCheck> judgeIgnition(std::string const& reply)
{
    if (reply == "ON") {
        return DoctorCheck{"ignition", Verdict::Good, "on, by the adapter's pin", ""};
    }
    if (reply == "OFF") {
        // Few boards wire the pin, so that this alone is no fault.
        return DoctorCheck{"ignition", Verdict::Note, "off, by the adapter's pin, which few boards connect",
                           "switch the ignition on if no control module answers"};
    }
    return std::nullopt;
}

bool checkAdapter(AdapterTalk& talk, DoctorReport& report)
{
    std::optional<std::string> identity = talk.ask("ATI", answerLimit);
    if (!identity || identity->ends_with('?')) {
        identity = talk.ask("ATI", answerLimit); // what stood in its line before made the first one unknown
    }
    if (!identity) {
        report.checks.push_back(
            {"adapter", Verdict::Bad, "sends no prompt", "is it an ELM327 adapter? pull it and plug it in again"});
        return false;
    }
    report.checks.push_back({"adapter", Verdict::Good, *identity, ""});
    talk.ask("ATE0", commandLimit);
    auto const ask = [&talk](std::string const& command) { return talk.ask(command, commandLimit); };
    std::optional<std::string> const stn = ask("STI");
    bool const isStn = stn && stn->starts_with("STN");
    if (isStn) {
        report.checks.push_back({"adapter", Verdict::Good, *stn, ""});
    }
    if (talk.echoed()) {
        report.checks.push_back({"adapter", Verdict::Note, "its echo stays on in spite of ATE0", ""});
    }
    judgeMatrix(probeCommands(ask, *identity, isStn), isStn, report);
    std::optional<std::string> const volts = ask("ATRV");
    report.checks.push_back(
        judgeVoltage(volts.value_or(""))
            .value_or(DoctorCheck{"voltage", Verdict::Note, "the adapter does not report the voltage", ""}));
    if (std::optional<DoctorCheck> const ignition = judgeIgnition(ask("ATIGN").value_or(""))) {
        report.checks.push_back(*ignition);
    }
    return true;
}

void checkBuses(AdapterTalk& talk, DoctorReport& report)
{
    std::vector<std::string> words;
    for (int number = 1; number <= 9 && !talk.lost(); ++number) {
        talk.ask(fmt::format("ATTP{}", number), commandLimit);
        std::string const reply = talk.ask("0100", searchLimit).value_or("no prompt");
        bool const answers = reply.find("41 00") != std::string::npos || reply.find("4100") != std::string::npos;
        report.checks.push_back({"bus", answers ? Verdict::Good : Verdict::Note,
                                 fmt::format("{} {}: {}", number, buses[number - 1], reply.substr(0, 60)),
                                 answers ? fmt::format("choose it: --protocol {}", number) : ""});
        if (answers) {
            return;
        }
    }
}

} // namespace velmora
