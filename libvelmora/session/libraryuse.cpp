#include "libvelmora/session/libraryuse.h"

#include <obd/library.h>
#include <velmora/error.h>

#include <fstream>

namespace velmora {

LibraryUse::LibraryUse(std::string const& logFile)
{
    // The library goes without a log that it can't write; who asked for one wants to know.
    if (!logFile.empty() && !std::ofstream(logFile, std::ios::app)) {
        throw Error(ErrorKind::Failed, "Could not write the log file " + logFile,
                    {"does its folder exist, and may you write there?"});
    }
    obd::LIBOBDOpen(logFile);
}

LibraryUse::~LibraryUse()
{
    obd::LIBOBDClose();
}

} // namespace velmora
