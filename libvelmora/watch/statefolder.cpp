#include "libvelmora/watch/statefolder.h"

#include "libvelmora/watch/watchsettings.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdlib>
#include <fstream>
#include <random>

namespace velmora {

namespace {

std::string environmentPath(char const* name)
{
    char const* const value = std::getenv(name);
    std::string const text = value == nullptr ? "" : value;
    return text.substr(0, text.find(':')); // a service may have several
}

} // namespace

bool runsAsService()
{
    return !environmentPath("STATE_DIRECTORY").empty();
}

std::filesystem::path stateFolder()
{
    std::filesystem::path folder = environmentPath("STATE_DIRECTORY");
    if (folder.empty()) {
        std::filesystem::path const base = environmentPath("XDG_STATE_HOME");
        std::filesystem::path const home = environmentPath("HOME");
        folder = (base.empty() ? home / ".local" / "state" : base) / "velmora";
    }
    std::error_code error;
    std::filesystem::create_directories(folder, error);
    if (error) {
        throw Error(ErrorKind::Failed, "Could not make the folder " + folder.string() + ": " + error.message(),
                    {"name another one in XDG_STATE_HOME"});
    }
    return folder;
}

std::string keptVehicleName(std::filesystem::path const& folder)
{
    std::filesystem::path const file = folder / "vehicle-name";
    std::ifstream in(file);
    std::string name;
    if (std::getline(in, name) && isVehicleName(name)) {
        return name;
    }
    std::random_device random;
    name = fmt::format("car-{:08x}", random());
    std::ofstream out(file);
    if (!(out << name << std::endl)) {
        throw Error(ErrorKind::Failed, "Could not write " + file.string(), {"name the vehicle with --vehicle"});
    }
    return name;
}

} // namespace velmora
