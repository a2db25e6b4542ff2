#include "libobd/catalogue/dtcreader.h"

#include <common/debuglogger.h>
#include <common/logrecord.h>
#include <obd/library.h>

#include <atomic>

namespace obd {
namespace {

// Never destroyed, as the dispatcher is not: at the process's end its worker may still run, and log.
tervex::DebugLogger& processLogger()
{
    static auto* const logger = new tervex::DebugLogger;
    return *logger;
}

// Whether the catalogue was filled here, so that a second opening does not fill it again.
std::atomic<bool> catalogueFilled{false};

} // namespace

bool LIBOBDOpen(std::string const& logPath)
{
    processLogger().open(logPath);
    TERVEX_LOG(Info) << "Lib OBD init";
    if (!catalogueFilled.exchange(true)) {
        DtcReader::init();
    }
    return true;
}

bool LIBOBDLogFailed()
{
    return processLogger().failed();
}

void LIBOBDClose()
{
    catalogueFilled = false;
    DtcReader::clean();
    TERVEX_LOG(Info) << "Lib OBD cleanup done";
    tervex::LogSink = nullptr;
}

} // namespace obd
