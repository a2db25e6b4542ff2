#include <obd/manufacturer.h>

#include <array>

namespace obd {
namespace {

// By value of the enumeration.
constexpr std::array<char const*, 45> makers = {
    "Generic", "Acura",  "Alfa Romeo", "Audi",   "BMW",        "Buick",   "Cadillac", "Chrysler",   "Citroen",
    "Daewoo",  "Dodge",  "Fiat",       "Ford",   "Geo",        "GM",      "Honda",    "Hyundai",    "Infinity",
    "Isuzu",   "Jaguar", "Jeep",       "Kia",    "Land Rover", "Lexus",   "Lincoln",  "Mazda",      "Mercedes-Benz",
    "Mercury", "Mini",   "Mitsubishi", "Nissan", "Oldsmobile", "Peugeot", "Plymouth", "Pontiac",    "Porsche",
    "Saab",    "Saturn", "Scion",      "Skoda",  "Subaru",     "Suzuki",  "Toyota",   "Volkswagen", "Volvo",
};

} // namespace

std::string Manufacturer::manufacturerToString(AutoManufacturer maker)
{
    return makers.at(static_cast<std::size_t>(maker));
}

} // namespace obd
