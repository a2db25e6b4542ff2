#pragma once

#include <velmora/export.h>
#include <velmora/troublecode.h>

#include <memory>
#include <string>
#include <vector>

/// The catalogue of trouble codes, with or without a car. Any thread.

namespace velmora {

class LibraryUse;

/// What one maker means by a code.
struct CatalogueRow
{
    std::string maker;  ///< "Generic", or a maker
    std::string code;   ///< "P0420"
    std::string system; ///< "Powertrain", "Body", "Chassis" or "Network"
    std::string text;   ///< the meaning
};

/// Keeps the catalogue open for as long as it lives: what follows opens it for each call, where nothing else does.
class VELMORA_EXPORT CatalogueUse
{
public:
    /// logFile gets what the library says of its work; none if empty. Throws Error if it can't be written.
    explicit CatalogueUse(std::string const& logFile = {});
    ~CatalogueUse();
    CatalogueUse(CatalogueUse const&) = delete;
    CatalogueUse& operator=(CatalogueUse const&) = delete;

private:
    std::unique_ptr<LibraryUse> m_use;
};

/// All meanings of a trouble code such as "P0420", in any letter case: the generic one first, then those of makers. A
/// code that is not in the catalogue has one meaning, which says so. Throws Error for what is no trouble code.
VELMORA_EXPORT TroubleCode explain(std::string const& code);
/// The same with what that maker means alone, and what the standard does. maker as the catalogue writes it; empty for
/// all.
VELMORA_EXPORT TroubleCode explain(std::string const& code, std::string const& maker);

/// The makers of the catalogue, as it writes them.
VELMORA_EXPORT std::vector<std::string> catalogueMakers();
/// The maker's name as the catalogue writes it, from one in any case and without its blanks or hyphens, or from a
/// common other one: "VW", "Mercedes", "Chevy". Throws Error with the list of makers if there is none.
VELMORA_EXPORT std::string findMaker(std::string const& name);

/// The rows whose text or code has, for each of the words, a word that begins with it, in any order and case; all rows
/// for no words. maker as the catalogue writes it; empty for all.
VELMORA_EXPORT std::vector<CatalogueRow> findRows(std::vector<std::string> const& words, std::string const& maker = {});

} // namespace velmora
