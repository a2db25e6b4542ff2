#pragma once

#include "libvelmora/signal/importing/signalimport.h"
#include "libvelmora/signal/signalfile.h"

#include <string>

namespace testsupport {

/// What came of an import on one line: all lines of its signals, then what was refused and what was noted.
inline std::string importedText(velmora::SignalImport const& import)
{
    std::string text;
    std::string const signals = velmora::toToml(import.file);
    std::string const marks[] = {"[vehicle]", "[[signal]]"};
    for (std::size_t at = 0; at < signals.size();) {
        std::size_t const end = signals.find('\n', at);
        std::string const line = signals.substr(at, end - at);
        if (!line.empty() && line != marks[0] && line != marks[1]) {
            text += line + "; ";
        }
        at = end + 1;
    }
    for (velmora::SignalMistake const& each : import.refused) {
        text += "refused " + velmora::toText(each, import.file.path) + "; ";
    }
    for (velmora::SignalMistake const& each : import.notes) {
        text += "noted " + velmora::toText(each, import.file.path) + "; ";
    }
    return text;
}

} // namespace testsupport
