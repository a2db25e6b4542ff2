#include "libvelmora/port/portholder.h"

#include <algorithm>
#include <cctype>
#include <fstream>
#include <unistd.h>

namespace velmora {

namespace {

namespace fs = std::filesystem;

std::string describe(std::string const& process, fs::path const& processes)
{
    std::string name;
    std::ifstream in(processes / process / "comm");
    std::getline(in, name);
    return (name.empty() ? "a program" : name) + " (process " + process + ")";
}

// A lock file holds the number of the process, by tradition in ten columns. One whose process has gone is stale.
std::optional<std::string> findLock(std::string const& device, HolderPlaces const& places)
{
    for (fs::path const& folder : places.lockFolders) {
        std::ifstream in(folder / ("LCK.." + fs::path(device).filename().string()));
        int process = 0;
        std::error_code error;
        if (in >> process && process > 0 && process != ::getpid() &&
            fs::exists(places.processes / std::to_string(process), error)) {
            return describe(std::to_string(process), places.processes);
        }
    }
    return std::nullopt;
}

bool hasOpen(fs::path const& process, fs::path const& device)
{
    std::error_code error;
    for (auto entry = fs::directory_iterator(process / "fd", error); !error && entry != fs::directory_iterator();
         entry.increment(error)) {
        std::error_code unreadable;
        if (fs::read_symlink(entry->path(), unreadable) == device) {
            return true;
        }
    }
    return false;
}

bool isNumber(std::string const& text)
{
    return std::all_of(text.begin(), text.end(),
                       [](char each) { return std::isdigit(static_cast<unsigned char>(each)) != 0; });
}

} // namespace

std::optional<std::string> findPortHolder(std::string const& device, HolderPlaces const& places)
{
    if (std::optional<std::string> holder = findLock(device, places)) {
        return holder;
    }
    std::error_code error;
    fs::path const real = fs::canonical(device, error);
    // Behind a pseudo-terminal stands a program that plays the adapter, and keeps it open.
    if (error || real.string().starts_with("/dev/pts/")) {
        return std::nullopt;
    }
    for (auto entry = fs::directory_iterator(places.processes, error); !error && entry != fs::directory_iterator();
         entry.increment(error)) {
        std::string const process = entry->path().filename();
        if (isNumber(process) && process != std::to_string(::getpid()) && hasOpen(entry->path(), real)) {
            return describe(process, places.processes);
        }
    }
    return std::nullopt;
}

} // namespace velmora
