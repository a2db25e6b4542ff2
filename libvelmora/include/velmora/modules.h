#pragma once

#include <velmora/export.h>
#include <velmora/print.h>
#include <velmora/topics.h>

#include <map>
#include <optional>
#include <string>
#include <vector>

/// Control modules beyond OBD, by the services of ISO 14229 and ISO 14230: see Car::findModules, Car::identifiers and
/// Car::udsCodes.

namespace velmora {

/// What a module tells by the identifiers of the standards, F180 to F19F, and 1A80, 1A90, 1A9B of service 1A: each with
/// its text.
using ModuleIdentifiers = std::map<unsigned int, std::string>;

/// A control module as it was found, and what it tells of itself. Texts are empty where it told none.
struct FoundModule
{
    std::string request;                ///< identifier or header, hexadecimal
    std::string reply;                  ///< of its replies
    std::string name;                   ///< by F197
    std::string part;                   ///< part number, by F187
    std::string software;               ///< version, by F189, else F195
    std::optional<unsigned int> codes;  ///< how many trouble codes matter; nothing if it does not tell
    ModuleIdentifiers identifiers = {}; ///< those that it told, where it was asked for them
};

/// How control modules are to be looked for.
struct ModuleSearch
{
    bool anew = false; ///< also where they are remembered of the vehicle: half a minute, with the vehicle standing
    bool identifiers = false; ///< asks each for all that the standards have identifiers for
};

/// A trouble code by service 19, or by service 18, whose numbers and states may be the maker's own.
struct UdsTroubleCode
{
    std::string code;                ///< "P0299"; empty by service 18
    unsigned char type = 0;          ///< failure type byte
    std::string hex;                 ///< "029900", "0299" by service 18
    unsigned char status = 0;        ///< status byte
    std::vector<std::string> states; ///< "present", "pending", "confirmed", "stored", "lamp", of those the module knows
    std::string meaning = {};        ///< that holds for the vehicle; empty where none is known to
    std::string failure = {};        ///< the failure type in words; empty where it may be the maker's own
};

/// What one module tells of its trouble codes by service 19, or by service 18 where it does not know that.
struct UdsModuleReport
{
    std::string module;                          ///< as people are told it: "7E8"
    std::string name;                            ///< empty if it is not known
    TopicAnswer answer;                          ///< how asking went
    std::string reason;                          ///< why there are no codes, in words
    bool byService18 = false;                    ///< rather than by service 19
    bool standard = false;                       ///< whether the codes are those of SAE J2012, with a failure type
    std::optional<unsigned char> format = {};    ///< of the codes, as the module tells it
    std::optional<unsigned char> available = {}; ///< the status bits that it knows
    std::vector<UdsTroubleCode> codes = {};      ///< in the order of the reply
};

/// The name of F180 to F19F, such as "vehicle manufacturer spare part number"; for 1A80 and other local identifiers
/// what service tells them.
VELMORA_EXPORT std::string identifierName(unsigned int identifier);

/// The data of such an identifier for people: text, "2023-05-17", "default session"; hexadecimal for what can't be read
/// as what it should be. Empty for data that is filling only.
VELMORA_EXPORT std::string identifierText(unsigned int identifier, std::vector<unsigned char> const& data);

/// A table, and below it the identifiers of each module that told some.
VELMORA_EXPORT std::string toText(std::vector<FoundModule> const& modules, TextStyle const& style);
/// Under a heading for each module a line for each code.
VELMORA_EXPORT std::string toText(std::vector<UdsModuleReport> const& modules, TextStyle const& style);
/// An array with an object for each module; ends in a line feed.
VELMORA_EXPORT std::string toJson(std::vector<FoundModule> const& modules);
/// An array with an object for each module; ends in a line feed.
VELMORA_EXPORT std::string toJson(std::vector<UdsModuleReport> const& modules);

} // namespace velmora
