#pragma once

#include "libvelmora/signal/signal.h"

#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// What came of a file of another form.
struct SignalImport
{
    SignalFile file;
    std::vector<SignalMistake> refused; // with the reason: what was not understood is told, never guessed
    std::vector<SignalMistake> notes;   // what was taken, with an assumption or without something
};

// Reads the CSV form that phone apps exchange (Name, ShortName, ModeAndPID, Equation, Min Value, Max Value, Units,
// Header; in real life also without that first row, with more columns, comments and mixed line ends). Throws Error
// (wrong use) for a text that is no such table.
SignalImport importSignalCsv(std::string_view text, std::string const& path);

// The JSON forms of OBDb (signal sets), WiCAN (vehicle profiles) and ABRP (requests by key). The line of a mistake is
// the number of the command, request or key. They throw Error (wrong use) for a text that is no JSON.
SignalImport importObdb(std::string_view text, std::string const& path);
SignalImport importWican(std::string_view text, std::string const& path);
SignalImport importAbrp(std::string_view text, std::string const& path);

// Reads a file in whichever of these forms it has. Throws Error (wrong use) for one that has none of them.
SignalImport importSignals(std::string_view text, std::string const& path);

// The same of a file. Throws Error (wrong use) for one that can't be read as well.
SignalImport importSignalFile(std::string const& path);

} // namespace velmora
