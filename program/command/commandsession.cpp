#include "program/command/commandsession.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/printtext.h"

#include <obd/library.h>

#include <utility>

namespace velmora::cli {

namespace {

// A line that is drawn over.
void tellPhase(std::string const& phase)
{
    tell("\r\033[K" + phase);
}

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
    result.signalFiles = options.signalFiles;
    if (!options.quiet) {
        result.onProgress = tellText;
        if (PromptReader::canRedraw()) {
            result.onPhase = tellPhase;
        }
    }
    if (options.verbose) {
        result.onDetail = tellText;
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
    if (std::string const file = failedTrace(); !file.empty()) {
        tellLateFailure("Could not write all of the trace file " + file + "; is the disk full?");
    }
    if (!m_options.logFile.empty() && obd::LIBOBDLogFailed()) {
        tellLateFailure("Could not write all of the log file " + m_options.logFile + "; is the disk full?");
    }
}

Error silentVehicle(Session const& session, std::string const& what, std::vector<std::string> hints)
{
    std::string const trouble = session.trouble();
    if (trouble.empty()) {
        return {ErrorKind::VehicleSilent, what, std::move(hints)};
    }
    hints.emplace_back("does the wiring hold, and is nothing else plugged into the car's bus?");
    return {ErrorKind::VehicleSilent, what + "; the adapter reports " + trouble, std::move(hints)};
}

} // namespace velmora::cli
