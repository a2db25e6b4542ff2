#include "libvelmora/session/libraryuse.h"

#include "libvelmora/record/checkedfile.h"

#include <obd/library.h>

namespace velmora {

LibraryUse::LibraryUse(std::string const& logFile)
{
    // The library goes without a log that it can't write; who asked for one wants to know.
    if (!logFile.empty()) {
        requireWritable(logFile, "log file");
    }
    obd::LIBOBDOpen(logFile);
}

LibraryUse::~LibraryUse()
{
    obd::LIBOBDClose();
}

} // namespace velmora
