#include "libvelmora/car/carprobe.h"

#include "common/text/text.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/moduleaddress.h"
#include "libvelmora/uds/vehiclevin.h"

#include <velmora/error.h>

#include <fmt/format.h>

namespace velmora {

namespace {

unsigned int hexadecimalOption(std::string const& text, char const* option, unsigned int highest)
{
    std::optional<unsigned int> const number = parseHex(text, highest);
    if (!number) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no hexadecimal number for {}", text, option),
                    {fmt::format("it goes from 0 to {:X}", highest)});
    }
    return *number;
}

// What an earlier run has left, of the same task and vehicle.
ProbeState beginProbe(ProbeStore const& store, ProbeTask const& task, std::string const& vin, bool fresh,
                      std::function<void(std::string const& at)> const& onResumed)
{
    ProbeState state;
    state.task = task;
    state.vin = vin;
    std::optional<ProbeState> const kept = fresh ? std::nullopt : store.load();
    if (!kept || kept->task != task) {
        return state;
    }
    if (kept->vin.empty() || kept->vin != vin) {
        throw Error(ErrorKind::WrongUse,
                    fmt::format("An interrupted probe of this module is of another vehicle ({}, this one is {})",
                                kept->vin.empty() ? "no VIN" : kept->vin, vin.empty() ? "without VIN" : vin),
                    {"--fresh drops it and begins anew"});
    }
    if (onResumed) {
        onResumed(probeIdText(task, kept->next));
    }
    return *kept;
}

} // namespace

ProbeTask probeTask(ProbeRequest const& request)
{
    ProbeTask task;
    std::optional<std::string> const header = hexDigits(request.module);
    if (!header) {
        throw Error(ErrorKind::WrongUse, fmt::format("\"{}\" is no identifier of a module", request.module),
                    {"7E0, 7B3 or 18DA10F1 are"});
    }
    task.header = *header;
    task.reply = hexDigits(request.reply).value_or(std::string());
    if (task.reply.empty()) {
        std::optional<std::string> const standard = standardReply(task.header);
        std::optional<std::string> const swapped = standard ? standard : swappedReply(task.header);
        if (!swapped) {
            throw Error(ErrorKind::WrongUse, "The identifier of this module's replies has to be told, with --reply",
                        {"`velmora modules` finds it"});
        }
        task.reply = *swapped;
    }
    if (!request.extended.empty()) {
        task.extended = static_cast<unsigned char>(hexadecimalOption(request.extended, "--ext", 0xFF));
    }
    task.service = static_cast<unsigned char>(hexadecimalOption(request.service, "--service", 0xFF));
    task.from = hexadecimalOption(request.from, "--from", 0xFFFF);
    task.to = hexadecimalOption(request.to, "--to", 0xFFFF);
    checkProbe(task);
    return task;
}

std::shared_ptr<ProbeState const> probeModule(Session& session, ProbeRequest const& request,
                                              std::function<void(std::string const& at)> const& onResumed)
{
    ProbeTask const task = probeTask(request);
    ProbeStore const store(ProbeStore::besides(session.settingsFile(), task));
    auto state =
        std::make_shared<ProbeState>(beginProbe(store, task, vehicleVin(*session.proxy()), request.fresh, onResumed));
    ModuleAsker asker(*session.proxy(), session.channel());
    auto const draw = session.options().onPhase;
    IdentifierProbe probe(
        asker, [&session] { session.check(); }, [&store](ProbeState const& now) { store.save(now); },
        [&draw](ProbeState const& now) {
            if (draw) {
                draw(fmt::format("Asked up to {}, {} told, {} locked", probeIdText(now.task, now.next), now.told.size(),
                                 now.locked.size()));
            }
        });
    probe.run(*state);
    if (draw) {
        draw({});
    }
    store.drop();
    return state;
}

} // namespace velmora
