#include "libvelmora/read/catalogueselection.h"

#include "libvelmora/session/libraryuse.h"

#include <obd/manufacturer.h>
#include <obd/troublecodecatalogue.h>
#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <iterator>
#include <string_view>

namespace velmora {

namespace {

// By hand, for the answer must not hang on the user's locale.
char lowerCase(char character)
{
    return character >= 'A' && character <= 'Z' ? static_cast<char>(character - 'A' + 'a') : character;
}

bool isWordCharacter(char lower)
{
    return (lower >= 'a' && lower <= 'z') || (lower >= '0' && lower <= '9');
}

std::vector<std::string> catalogueWords(std::string const& text)
{
    std::vector<std::string> words;
    std::string word;
    for (char const character : text + ' ') {
        char const lower = lowerCase(character);
        if (isWordCharacter(lower)) {
            word += lower;
        } else if (!word.empty()) {
            words.push_back(std::move(word));
            word.clear();
        }
    }
    return words;
}

std::string joined(std::string const& name)
{
    return fmt::format("{}", fmt::join(catalogueWords(name), ""));
}

// What people call makers otherwise: short names, brands whose codes are their group's, and names whose letters with
// accents no word of the catalogue has. As joined makes them.
std::string_view otherName(std::string_view name)
{
    struct Other
    {
        std::string_view name;
        std::string_view maker;
    };
    static constexpr Other names[] = {
        {"alfa", "Alfa Romeo"},
        {"benz", "Mercedes-Benz"},
        {"chevrolet", "GM"},
        {"chevy", "GM"},
        {"citron", "Citroen"},
        {"generalmotors", "GM"},
        {"gmc", "GM"},
        {"infiniti", "Infinity"},
        {"koda", "Skoda"},
        {"mb", "Mercedes-Benz"},
        {"mercedes", "Mercedes-Benz"},
        {"olds", "Oldsmobile"},
        {"rangerover", "Land Rover"},
        {"vw", "Volkswagen"},
    };
    auto const* const found = std::ranges::find(names, name, &Other::name);
    return found != std::end(names) ? found->maker : name;
}

bool holdsAll(std::vector<std::string> const& words, std::vector<std::string> const& wanted)
{
    return std::all_of(wanted.begin(), wanted.end(), [&words](std::string const& start) {
        return std::any_of(words.begin(), words.end(),
                           [&start](std::string const& word) { return word.starts_with(start); });
    });
}

} // namespace

std::vector<std::string> catalogueMakers()
{
    std::vector<std::string> names;
    for (int maker = obd::Manufacturer::Generic; maker <= obd::Manufacturer::Volvo; ++maker) {
        names.push_back(
            obd::Manufacturer::manufacturerToString(static_cast<obd::Manufacturer::AutoManufacturer>(maker)));
    }
    return names;
}

std::string findMaker(std::string const& name)
{
    std::vector<std::string> const names = catalogueMakers();
    std::string const wanted = joined(std::string(otherName(joined(name))));
    auto const found = std::find_if(names.begin(), names.end(),
                                    [&wanted](std::string const& candidate) { return joined(candidate) == wanted; });
    if (found == names.end()) {
        throw Error(ErrorKind::WrongUse, "The catalogue has no maker \"" + name + "\"",
                    {fmt::format("these it has: {}", fmt::join(names, ", "))});
    }
    return *found;
}

CatalogueRows selectMaker(CatalogueRows const& rows, std::string const& maker)
{
    CatalogueRows selected;
    std::copy_if(rows.begin(), rows.end(), std::back_inserter(selected),
                 [&maker](auto const& row) { return row->manufacturer == maker; });
    return selected;
}

CatalogueRows selectWords(CatalogueRows const& rows, std::vector<std::string> const& words)
{
    std::vector<std::string> const wanted = catalogueWords(fmt::format("{}", fmt::join(words, " ")));
    CatalogueRows selected;
    std::copy_if(rows.begin(), rows.end(), std::back_inserter(selected), [&wanted](auto const& row) {
        return holdsAll(catalogueWords(row->code + ' ' + row->description), wanted);
    });
    return selected;
}

std::vector<CatalogueRow> findRows(std::vector<std::string> const& words, std::string const& maker)
{
    LibraryUse const catalogue{std::string()};
    CatalogueRows rows = selectWords(obd::TroubleCodeCatalogue::getRows(), words);
    if (!maker.empty()) {
        rows = selectMaker(rows, maker);
    }
    std::vector<CatalogueRow> found;
    found.reserve(rows.size());
    for (auto const& row : rows) {
        found.push_back({row->manufacturer, row->code, row->system, row->description});
    }
    return found;
}

CatalogueUse::CatalogueUse(std::string const& logFile) : m_use(std::make_unique<LibraryUse>(logFile)) {}

CatalogueUse::~CatalogueUse() = default;

} // namespace velmora
