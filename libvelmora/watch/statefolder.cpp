#include "libvelmora/watch/statefolder.h"

#include "libvelmora/watch/watchsettings.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <cstdlib>
#include <fcntl.h>
#include <fstream>
#include <random>
#include <unistd.h>

namespace velmora {

namespace {

constexpr char const* lastFile = "vehicle-name";
constexpr char const* listFile = "vehicles";

std::string madeUpName()
{
    std::random_device random;
    return fmt::format("car-{:08x}", random());
}

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

std::string VehicleNames::last() const
{
    std::ifstream in(m_folder / lastFile);
    std::string name;
    if (std::getline(in, name) && isVehicleName(name)) {
        return name;
    }
    name = madeUpName();
    write(lastFile, name + "\n");
    return name;
}

std::string VehicleNames::of(std::string const& vin)
{
    std::string name = last();
    std::string list;
    bool taken = false;
    std::ifstream in(m_folder / listFile);
    std::string knownVin;
    std::string knownName;
    while (in >> knownVin >> knownName) {
        if (knownVin == vin && isVehicleName(knownName)) {
            if (knownName != name) {
                write(lastFile, knownName + "\n");
            }
            return knownName;
        }
        taken = taken || knownName == name;
        list += knownVin + " " + knownName + "\n";
    }
    if (taken) {
        name = madeUpName();
        write(lastFile, name + "\n");
    }
    write(listFile, list + vin + " " + name + "\n");
    return name;
}

// In place of the old one only when it is whole.
void VehicleNames::write(std::string const& name, std::string const& text) const
{
    std::filesystem::path const fresh = m_folder / (name + ".new");
    int const file = ::open(fresh.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0600);
    bool written = file >= 0 && ::write(file, text.data(), text.size()) == static_cast<ssize_t>(text.size());
    written = written && ::fsync(file) == 0;
    if (file >= 0) {
        ::close(file);
    }
    std::error_code error;
    if (written) {
        std::filesystem::rename(fresh, m_folder / name, error);
    }
    if (!written || error) {
        throw Error(ErrorKind::Failed, "Could not write " + (m_folder / name).string(),
                    {"name the vehicle with --vehicle"});
    }
}

} // namespace velmora
