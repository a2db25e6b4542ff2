#include "libobd/catalogue/dtcreader.h"

#include <common/debuglogger.h>
#include <common/logrecord.h>
#include <obd/library.h>

namespace obd {
namespace {

// Lives until the library is unloaded, so that its file takes every line until then.
tervex::DebugLogger& processLogger()
{
    static tervex::DebugLogger logger;
    return logger;
}

} // namespace

bool LIBOBDOpen(std::string const& logPath)
{
    processLogger().open(logPath);
    TERVEX_LOG(Info) << "Lib OBD init";
    DtcReader::init();
    return true;
}

void LIBOBDClose()
{
    DtcReader::clean();
    TERVEX_LOG(Info) << "Lib OBD cleanup done";
    tervex::LogSink = nullptr;
}

} // namespace obd
