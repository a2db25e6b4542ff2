#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// Opens the library: starts the log in the file logPath (truncated; no log if empty or if it can't be opened) and
/// loads the trouble code texts. Always true: neither step can keep the library from working. Log lines before it are
/// lost. Called again, it begins a new log and leaves the texts as they are. The log takes lines until the process has
/// ended.
OBD_EXPORT bool LIBOBDOpen(std::string const& logPath);

/// Whether a line of the log could not be written since LIBOBDOpen, such as on a full disk. Any thread.
OBD_EXPORT bool LIBOBDLogFailed();

/// Releases the trouble code texts and ends the log. Call it last, after every object of the library is gone.
OBD_EXPORT void LIBOBDClose();

} // namespace obd
