#include <obd/manufacturer.h>

#include <gtest/gtest.h>

#include <stdexcept>

namespace {

using obd::Manufacturer;

struct Row
{
    Manufacturer::AutoManufacturer maker;
    int value;
    char const* name;
};

TEST(Manufacturer, EachMakerHasItsNumberAndName)
{
    static constexpr Row rows[] = {
        {Manufacturer::Generic, 0, "Generic"},
        {Manufacturer::Acura, 1, "Acura"},
        {Manufacturer::AlfaRomeo, 2, "Alfa Romeo"},
        {Manufacturer::Audi, 3, "Audi"},
        {Manufacturer::BMW, 4, "BMW"},
        {Manufacturer::Buick, 5, "Buick"},
        {Manufacturer::Cadillac, 6, "Cadillac"},
        {Manufacturer::Chrysler, 7, "Chrysler"},
        {Manufacturer::Citroen, 8, "Citroen"},
        {Manufacturer::Daewoo, 9, "Daewoo"},
        {Manufacturer::Dodge, 10, "Dodge"},
        {Manufacturer::Fiat, 11, "Fiat"},
        {Manufacturer::Ford, 12, "Ford"},
        {Manufacturer::Geo, 13, "Geo"},
        {Manufacturer::GM, 14, "GM"},
        {Manufacturer::Honda, 15, "Honda"},
        {Manufacturer::Hyundai, 16, "Hyundai"},
        {Manufacturer::Infinity, 17, "Infinity"},
        {Manufacturer::Isuzu, 18, "Isuzu"},
        {Manufacturer::Jaguar, 19, "Jaguar"},
        {Manufacturer::Jeep, 20, "Jeep"},
        {Manufacturer::Kia, 21, "Kia"},
        {Manufacturer::LandRover, 22, "Land Rover"},
        {Manufacturer::Lexus, 23, "Lexus"},
        {Manufacturer::Lincoln, 24, "Lincoln"},
        {Manufacturer::Mazda, 25, "Mazda"},
        {Manufacturer::MercedesBenz, 26, "Mercedes-Benz"},
        {Manufacturer::Mercury, 27, "Mercury"},
        {Manufacturer::Mini, 28, "Mini"},
        {Manufacturer::Mitsubishi, 29, "Mitsubishi"},
        {Manufacturer::Nissan, 30, "Nissan"},
        {Manufacturer::Oldsmobile, 31, "Oldsmobile"},
        {Manufacturer::Peugeot, 32, "Peugeot"},
        {Manufacturer::Plymouth, 33, "Plymouth"},
        {Manufacturer::Pontiac, 34, "Pontiac"},
        {Manufacturer::Porsche, 35, "Porsche"},
        {Manufacturer::Saab, 36, "Saab"},
        {Manufacturer::Saturn, 37, "Saturn"},
        {Manufacturer::Scion, 38, "Scion"},
        {Manufacturer::Skoda, 39, "Skoda"},
        {Manufacturer::Subaru, 40, "Subaru"},
        {Manufacturer::Suzuki, 41, "Suzuki"},
        {Manufacturer::Toyota, 42, "Toyota"},
        {Manufacturer::Volkswagen, 43, "Volkswagen"},
        {Manufacturer::Volvo, 44, "Volvo"},
    };
    for (Row const& row : rows) {
        EXPECT_EQ(row.maker, row.value) << row.name;
        EXPECT_EQ(Manufacturer::manufacturerToString(row.maker), row.name);
    }
}

TEST(Manufacturer, ANumberThatIsNoMakerThrows)
{
    EXPECT_THROW(Manufacturer::manufacturerToString(static_cast<Manufacturer::AutoManufacturer>(45)),
                 std::out_of_range);
    EXPECT_THROW(Manufacturer::manufacturerToString(static_cast<Manufacturer::AutoManufacturer>(-1)),
                 std::out_of_range);
}

} // namespace
