#include "libvelmora/session/libraryuse.h"

#include "libvelmora/record/checkedfile.h"

#include <obd/library.h>

#include <mutex>

namespace velmora {

namespace {

std::mutex usesMutex;
unsigned int uses = 0; // protected by usesMutex

} // namespace

LibraryUse::LibraryUse(std::string const& logFile)
{
    // The library goes without a log that it can't write; who asked for one wants to know.
    if (!logFile.empty()) {
        requireWritable(logFile, "log file");
    }
    std::lock_guard const lock(usesMutex);
    if (uses == 0 || !logFile.empty()) {
        obd::LIBOBDOpen(logFile);
    }
    ++uses;
}

LibraryUse::~LibraryUse()
{
    std::lock_guard const lock(usesMutex);
    if (--uses == 0) {
        obd::LIBOBDClose();
    }
}

} // namespace velmora
