#include "program/watch/dashplay.h"

#include "libvelmora/dash/dashoutput.h"
#include "libvelmora/dash/playdesk.h"
#include "libvelmora/session/settingsstore.h"
#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/view/qrtext.h"

#include <fmt/format.h>

#include <chrono>
#include <thread>
#include <unistd.h>

namespace velmora::cli {

namespace {

constexpr std::chrono::milliseconds pageStep{100};

DashContext pageContext(GlobalOptions const& global, PlayDesk& desk)
{
    DashContext context;
    context.desk = desk.desk();
    context.health = [] {
        Health health;
        health.linkUp = true;
        health.state = "playing";
        return health;
    };
    context.playState = [&desk] { return desk.state(); };
    context.settings =
        global.settingsFile.empty() ? SettingsStore::defaultFile() : std::filesystem::path(global.settingsFile);
    context.layouts = DashLayouts::besides(context.settings);
    context.mustListen = true;
    context.onLink = [](std::string const& link, std::string const& remark) {
        fmt::print("{}\n", link);
        flushOutput();
        tell(remark.empty() ? remark : remark + "\n");
        tell(qrForTerminal(link, STDERR_FILENO));
    };
    return context;
}

} // namespace

ExitCode playOnPage(GlobalOptions const& global, OutputAddress const& address, Recording const& recording, double speed)
{
    PlayDesk desk(recording, speed);
    DashOutput output(address, pageContext(global, desk));
    output.open();
    desk.introduce();
    auto last = std::chrono::steady_clock::now();
    while (!Interrupt::instance().raised()) {
        auto const now = std::chrono::steady_clock::now();
        desk.step(std::chrono::duration<double>(now - last).count());
        last = now;
        output.write({});
        std::this_thread::sleep_for(pageStep);
    }
    output.close();
    return ExitCode::Done;
}

} // namespace velmora::cli
