#pragma once

#include "simulator/adapter/quirk.h"
#include "simulator/peer.h"

namespace obdsim {

enum class AdapterFamily : unsigned int
{
    Elm = 0x01,
    Stn = 0x02, ///< an ELM327 to its host, with ST commands of its own
    ObdKey = 0x04,
    Diamex = 0x08,
    Kiwi = 0x10,
    ObdPros = 0x20,
    Other = 0x40,
    Silent = 0x80 ///< nothing ever comes back
};

/// What an adapter takes of its own time.
struct AdapterTiming
{
    Time command = Ms(4);     ///< from the CR of a line to the work on it
    std::optional<Time> wait; ///< it listens that long behind each reply, whatever ATST and ATAT say
    int baud = 0;             ///< line rate; 0: characters take no time
};

/// An adapter model.
struct AdapterProfile
{
    std::string key; ///< its name in options
    AdapterFamily family = AdapterFamily::Elm;
    std::string banner;      ///< answer to ATI, ATZ and ATWS
    std::string description; ///< answer to AT@1
    std::string identifier;  ///< answer to AT@2; empty: "?"
    int level = 142;         ///< knows the ELM327 commands up to that version, see Command::level
    std::string chip;        ///< answer to STI
    Quirks quirks;
    AdapterTiming timing = {};
};

/// The profile of that key; null if there is none.
AdapterProfile const* findProfile(std::string_view key);

std::vector<std::string> profileKeys();

/// The profile that a recorded banner such as "ELM327 v2.1" stands for: one of the
/// table, or the nearest one of the same family with that banner put in.
AdapterProfile profileForBanner(std::string const& banner);

} // namespace obdsim
