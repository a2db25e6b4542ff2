#include "program/command/keepscan.h"

#include "program/command/confirm.h"
#include "program/terminal/output.h"

#include <velmora/error.h>
#include <velmora/history.h>
#include <velmora/settingsfile.h>
#include <velmora/version.h>

#include <fmt/format.h>

#include <unistd.h>

namespace velmora::cli {

void addKeepOptions(CLI::App& command, KeepWish& wish)
{
    command.add_option("--vehicle", wish.vehicle, "Name of a vehicle that does not tell its identification number")
        ->type_name("NAME");
#ifdef VELMORA_HISTORY
    CLI::Option* const keep =
        command.add_flag("--history", wish.keep, "Keep the scan in the history of the vehicle (asked once)");
    command.add_flag("--no-history", wish.drop, "Do not keep the scan, and do not ask")->excludes(keep);
#endif
}

#ifdef VELMORA_HISTORY

namespace {

bool hasTerminal()
{
    return ::isatty(STDIN_FILENO) != 0 && ::isatty(STDERR_FILENO) != 0;
}

void remember(SettingsFile& settings, bool keep)
{
    try {
        settings.setNumber(historyKeepKey, keep ? 1 : 0);
    } catch (Error const& error) {
        tell(fmt::format("velmora: the answer is not remembered: {}\n", error.what()));
    }
}

bool ask(SettingsFile& settings, GlobalOptions const& options)
{
    std::string const what = fmt::format(
        "velmora can keep each scan, by the vehicle's identification number, to tell later what has changed:\n"
        "  {}\nNothing leaves this machine. velmora history shows, exports and forgets it.\n",
        History::defaultFile());
    bool const keep = confirmed(options, what, "Keep this scan and those to come?");
    remember(settings, keep);
    tell(keep ? "" : "Nothing is kept; scan --history keeps a single one.\n");
    return keep;
}

} // namespace

bool decidesToKeep(KeepWish& wish, GlobalOptions const& options)
{
    if (wish.drop) {
        return false;
    }
    bool const mayAsk = !wish.keep && hasTerminal() && !options.json;
    if (!wish.keep && !mayAsk) {
        return false;
    }
    SettingsFile settings(options.settingsFile);
    if (wish.vehicle.empty()) {
        wish.vehicle = settings.text(historyNameKey).value_or(std::string());
    }
    std::optional<int> const kept = settings.number(historyKeepKey);
    if (wish.keep || kept) {
        return wish.keep || *kept != 0;
    }
    return !options.yes && ask(settings, options); // who wants no questions has not said yes to this one
}

void keepScan(VehicleReport const& report, KeepWish const& wish, GlobalOptions const& options)
{
    using namespace std::chrono;
    try {
        History history(History::Access::Keep);
        KeptScan const scan =
            makeScan(report, wish.vehicle, floor<milliseconds>(system_clock::now()), std::string(versionText));
        std::optional<std::int64_t> const number = history.add(scan);
        if (number && !options.quiet) {
            tell(fmt::format("Kept as scan {} of {}; velmora diff tells what has changed\n", *number, scan.vehicle));
        }
    } catch (Error const& error) {
        std::string text = fmt::format("The scan is not kept: {}", error.what());
        for (std::string const& hint : error.hints()) {
            text += "\n  - " + hint;
        }
        wish.keep ? tellLateFailure(text) : tell("velmora: " + text + "\n");
    }
}

#else

bool decidesToKeep(KeepWish& /*wish*/, GlobalOptions const& /*options*/)
{
    return false;
}

void keepScan(VehicleReport const& /*report*/, KeepWish const& /*wish*/, GlobalOptions const& /*options*/) {}

#endif

} // namespace velmora::cli
