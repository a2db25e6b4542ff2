#pragma once

#include <obd/export.h>

#include <string>

namespace obd {

/// The vehicle makers that the trouble code catalogue tells apart. The library does not know of what make the vehicle
/// is; it hands out the meanings of all of them.
class OBD_EXPORT Manufacturer
{
public:
    /// Numbers that stay as they are.
    enum AutoManufacturer : int
    {
        Generic = 0, ///< the codes of SAE J2012 that mean the same on every vehicle
        Acura = 1,
        AlfaRomeo = 2,
        Audi = 3,
        BMW = 4,
        Buick = 5,
        Cadillac = 6,
        Chrysler = 7,
        Citroen = 8,
        Daewoo = 9,
        Dodge = 10,
        Fiat = 11,
        Ford = 12,
        Geo = 13,
        GM = 14,
        Honda = 15,
        Hyundai = 16,
        Infinity = 17,
        Isuzu = 18,
        Jaguar = 19,
        Jeep = 20,
        Kia = 21,
        LandRover = 22,
        Lexus = 23,
        Lincoln = 24,
        Mazda = 25,
        MercedesBenz = 26,
        Mercury = 27,
        Mini = 28,
        Mitsubishi = 29,
        Nissan = 30,
        Oldsmobile = 31,
        Peugeot = 32,
        Plymouth = 33,
        Pontiac = 34,
        Porsche = 35,
        Saab = 36,
        Saturn = 37,
        Scion = 38,
        Skoda = 39,
        Subaru = 40,
        Suzuki = 41,
        Toyota = 42,
        Volkswagen = 43,
        Volvo = 44,
    };

    /// The name as trouble codes carry it, such as "Alfa Romeo". Throws std::out_of_range for a number that is no
    /// maker.
    static std::string manufacturerToString(AutoManufacturer maker);
};

} // namespace obd
