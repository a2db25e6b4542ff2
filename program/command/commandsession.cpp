#include "program/command/commandsession.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"

namespace velmora::cli {

namespace {

SessionOptions sessionOptions(GlobalOptions const& options)
{
    SessionOptions result;
    result.port = options.port;
    result.baud = options.baud;
    result.protocol = options.protocol;
    result.units = options.units;
    result.ecu = options.ecu;
    result.reset = options.reset;
    result.sleep = options.sleep;
    result.forget = options.forget;
    result.logFile = options.logFile;
    result.traceFile = options.traceFile;
    result.settingsFile = options.settingsFile;
    if (!options.quiet) {
        result.onProgress = tell;
    }
    if (options.verbose) {
        result.onDetail = tell;
    }
    return result;
}

} // namespace

CommandSession::CommandSession(GlobalOptions const& options) : Session(sessionOptions(options)), m_options(options)
{
    Interrupt::instance().setHandler([this] { interrupt(); });
}

CommandSession::~CommandSession()
{
    Interrupt::instance().setHandler(nullptr);
}

} // namespace velmora::cli
