#include "libvelmora/read/servicereplies.h"
#include "libvelmora/report/json.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/command/confirm.h"
#include "program/commandline.h"
#include "program/terminal/output.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <set>

namespace velmora::cli {

namespace {

constexpr unsigned char clearService = 0x04;
// Some modules write their memory before they answer.
constexpr unsigned int clearLimitMs = 5000;

constexpr char const* clearWarning =
    R"(This clears the confirmed and pending trouble codes of all control modules and turns the lamp off.
It also erases: freeze frames, readiness (the vehicle must be driven before it can pass an emissions
test), monitor test results, and the distance and time since codes were cleared.
Permanent codes stay. Note codes and freeze frame down first if they may be needed.
)";

struct ModuleOutcome
{
    unsigned int id;
    std::string name;
    ServiceReply reply;
};

char const* resultWord(ServiceReply::Kind kind)
{
    static constexpr char const* words[] = {"cleared", "refused", "no answer", "the reply can't be read"};
    return words[static_cast<int>(kind)];
}

// Clearing is functional: the request reaches every module, whichever one is selected.
void checkOptions(GlobalOptions const& options)
{
    if (options.ecu) {
        throw Error(ErrorKind::WrongUse, "Clearing reaches all control modules; it can't be held to one",
                    {"leave --ecu out to clear the codes of all"});
    }
    requireConsent(options, "Clearing", "clears without asking");
}

// The library's own clearing tells of the current module alone, and not why it failed; asking again to learn of the
// others would clear twice.
std::vector<ModuleOutcome> clearCodes(Session& session)
{
    ServiceReplies const replies(*session.proxy(), clearService, clearLimitMs);
    session.check();
    obd::IEcuManager& modules = *session.obd().getEcuManager();
    std::vector<unsigned int> known;
    modules.getEcuIds(known);
    std::set<unsigned int> ids(known.begin(), known.end());
    for (unsigned int const id : replies.answering()) {
        ids.insert(id);
    }
    std::vector<ModuleOutcome> outcomes;
    for (unsigned int const id : ids) {
        outcomes.push_back({id, modules.getEcuName(id), replies.of(id)});
    }
    for (std::shared_ptr<obd::IEcu> const& ecu : modules.getEcus()) {
        if (replies.of(ecu->id()).kind == ServiceReply::Kind::Positive) {
            ecu->resetFreezeFrameConfiguration(); // the module has erased what the library knows of them
        }
    }
    return outcomes;
}

void printOutcomes(std::vector<ModuleOutcome> const& outcomes)
{
    for (ModuleOutcome const& outcome : outcomes) {
        fmt::print("Control module {:X}{}{}: {}{}{}\n", outcome.id, outcome.name.empty() ? "" : " ", outcome.name,
                   resultWord(outcome.reply.kind), outcome.reply.reason.empty() ? "" : ": ", outcome.reply.reason);
    }
}

void printJson(std::vector<ModuleOutcome> const& outcomes)
{
    Json list = Json::array();
    for (ModuleOutcome const& outcome : outcomes) {
        list.push_back({{"id", fmt::format("{:X}", outcome.id)},
                        {"name", textOrNull(outcome.name)},
                        {"cleared", outcome.reply.kind == ServiceReply::Kind::Positive},
                        {"result", resultWord(outcome.reply.kind)},
                        {"reason", textOrNull(outcome.reply.reason)}});
    }
    fmt::print("{}", printed(list));
}

ExitCode judge(std::vector<ModuleOutcome> const& outcomes)
{
    bool cleared = false;
    for (ModuleOutcome const& outcome : outcomes) {
        if (outcome.reply.kind == ServiceReply::Kind::Refused) {
            throw Error(
                ErrorKind::Refused,
                fmt::format("Control module {:X} refused to clear its codes: {}", outcome.id, outcome.reply.reason),
                {"most modules clear only with the ignition on and the engine off"});
        }
        cleared = cleared || outcome.reply.kind == ServiceReply::Kind::Positive;
    }
    if (!cleared) {
        throw Error(ErrorKind::VehicleSilent, "No control module confirmed that it cleared its codes",
                    {"is the ignition still on?", "`velmora codes` tells what is stored now"});
    }
    return ExitCode::Done;
}

ExitCode clear(GlobalOptions const& options)
{
    checkOptions(options);
    CommandSession session(options);
    session.connect();
    if (!confirmed(session, clearWarning, "Clear now?")) {
        tell("Nothing was cleared.\n");
        return ExitCode::Failed;
    }
    std::vector<ModuleOutcome> const outcomes = clearCodes(session);
    if (options.json) {
        printJson(outcomes);
    } else {
        printOutcomes(outcomes);
    }
    flushOutput();
    return judge(outcomes);
}

} // namespace

void addClearCommand(CommandLine& commandLine)
{
    commandLine.addCommand("clear",
                           "Clear trouble codes, and with them freeze frames and readiness, in all control modules; "
                           "asks first",
                           clear);
}

} // namespace velmora::cli
