#include "tools/catalogue/makers.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace catalogue {

namespace {

// In the order of the library's enumeration of makers: the table stores a maker as its place in this list.
constexpr std::array<std::string_view, 45> makerNames = {
    "Generic", "Acura",  "Alfa Romeo", "Audi",   "BMW",        "Buick",   "Cadillac", "Chrysler",   "Citroen",
    "Daewoo",  "Dodge",  "Fiat",       "Ford",   "Geo",        "GM",      "Honda",    "Hyundai",    "Infinity",
    "Isuzu",   "Jaguar", "Jeep",       "Kia",    "Land Rover", "Lexus",   "Lincoln",  "Mazda",      "Mercedes-Benz",
    "Mercury", "Mini",   "Mitsubishi", "Nissan", "Oldsmobile", "Peugeot", "Plymouth", "Pontiac",    "Porsche",
    "Saab",    "Saturn", "Scion",      "Skoda",  "Subaru",     "Suzuki",  "Toyota",   "Volkswagen", "Volvo",
};

} // namespace

std::size_t makerCount()
{
    return makerNames.size();
}

std::string_view makerName(std::size_t maker)
{
    return makerNames.at(maker);
}

std::optional<std::size_t> findMaker(std::string_view name)
{
    auto const found = std::find(makerNames.begin(), makerNames.end(), name);
    if (found == makerNames.end()) {
        return std::nullopt;
    }
    return static_cast<std::size_t>(std::distance(makerNames.begin(), found));
}

} // namespace catalogue
