#include "simulator/car/vehiclelibrary.h"

#include "simulator/car/embeddedvehicles.h"
#include "simulator/textfile.h"

#include <algorithm>

namespace obdsim {

namespace {

std::string readFile(std::string const& path)
{
    auto text = readTextFile(path);
    if (!text) {
        std::string names;
        for (auto const& name : vehicleNames()) {
            names += names.empty() ? name : ", " + name;
        }
        throw VehicleFileError(path + ": no vehicle of that name, and no vehicle file, for " + whyNoText(path) +
                               "; the vehicles are " + names);
    }
    return *std::move(text);
}

} // namespace

std::vector<std::string> vehicleNames()
{
    std::vector<std::string> names;
    for (std::size_t i = 0; i < embeddedVehicleCount; ++i) {
        names.emplace_back(embeddedVehicles[i].name);
    }
    std::sort(names.begin(), names.end());
    return names;
}

VehicleData loadVehicle(std::string const& nameOrPath)
{
    for (std::size_t i = 0; i < embeddedVehicleCount; ++i) {
        if (nameOrPath == embeddedVehicles[i].name) {
            return parseVehicle(embeddedVehicles[i].text, nameOrPath + ".toml");
        }
    }
    return parseVehicle(readFile(nameOrPath), nameOrPath);
}

} // namespace obdsim
