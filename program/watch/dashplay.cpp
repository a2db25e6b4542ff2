#include "program/watch/dashplay.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/view/qrtext.h"

#include <velmora/recording.h>

#include <fmt/format.h>

#include <unistd.h>

namespace velmora::cli {

ExitCode playOnPage(GlobalOptions const& global, std::string const& address, Recording const& recording, double speed)
{
    PagePlay play(recording, address, speed, global.settingsFile,
                  [](std::string const& link, std::string const& remark) {
                      fmt::print("{}\n", link);
                      flushOutput();
                      tell(remark.empty() ? remark : remark + "\n");
                      tell(qrForTerminal(link, STDERR_FILENO));
                  });
    Interrupt::instance().setHandler([&play] { play.end(); });
    try {
        play.run();
    } catch (...) {
        Interrupt::instance().setHandler(nullptr);
        throw;
    }
    Interrupt::instance().setHandler(nullptr);
    return ExitCode::Done;
}

} // namespace velmora::cli
