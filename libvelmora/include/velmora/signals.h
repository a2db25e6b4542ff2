#pragma once

#include <velmora/export.h>

#include <cstddef>
#include <string>
#include <vector>

/// Files of signals of one's own (docs/signals.md): what is in them, and what is wrong with them.
/// CarOptions::signalFiles has them read.

namespace velmora {

/// A signal, as a list shows it.
struct SignalOutline
{
    std::string id;                     ///< by which sensors are named: capitals, digits and '_'
    std::string name;                   ///< for people
    std::string header;                 ///< of the request in hexadecimal; empty for a broadcast
    std::vector<unsigned char> request; ///< from the service on; empty for one that is worked out from others
    std::string unit;                   ///< label; empty for none
    bool enabled = true;                ///< whether it is read
    std::string reason;                 ///< why it is switched off, or what was assumed of it
};

/// What is wrong in a file, and where.
struct SignalMistake
{
    std::size_t line = 0; ///< from 1 on; in JSON the number of the command, request or key; 0 for none
    std::string key;      ///< "signal 3, formula"; empty for the file as a whole
    std::string what;     ///< what is wrong with it
};

/// A file of signals as it was read.
struct SignalListing
{
    std::string path;                    ///< of the file
    std::vector<SignalOutline> signals;  ///< without those that hold a mistake
    std::vector<SignalMistake> mistakes; ///< what was left out, and why
    std::vector<SignalMistake> notes;    ///< what was taken with an assumption, or without something
    std::string toml;                    ///< the signals as a file of this system
    std::string json;                    ///< the same as one JSON document
};

/// Reads a signal file. Throws Error for one that can't be read, and for one with mistakes, which its hints list.
VELMORA_EXPORT SignalListing listSignals(std::string const& path);
/// The same, with the mistakes in the listing. Throws Error for a file that can't be read.
VELMORA_EXPORT SignalListing checkSignals(std::string const& path);
/// Reads a file in one of the forms that other programs write: CSV, and JSON of three kinds. What is not understood is
/// left out and told, never guessed. Throws Error for a file that can't be read or has none of these forms.
VELMORA_EXPORT SignalListing convertSignals(std::string const& path);
/// "gearbox.toml:12: signal 3, formula: ..."
VELMORA_EXPORT std::string toText(SignalMistake const& mistake, std::string const& path);

} // namespace velmora
