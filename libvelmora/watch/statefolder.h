#pragma once

#include <filesystem>
#include <string>

namespace velmora {

// Where the watch keeps what it has to remember: STATE_DIRECTORY, as service managers set it, else velmora in
// XDG_STATE_HOME or in .local/state of HOME. Made if it is missing. Throws Error.
std::filesystem::path stateFolder();

// Whether a service manager gave the folder.
bool runsAsService();

// The made-up names of vehicles that were given none: one for each vehicle identification number, which outputs don't
// tell. Kept in the folder, for its owner only. They throw Error if it can't be read or written.
class VehicleNames
{
public:
    explicit VehicleNames(std::filesystem::path folder) : m_folder(std::move(folder)) {}

    // The name in use last; the first one is made up.
    std::string last() const;
    // The name of the vehicle with that number, which is the last from now on. A number that was not seen before gets
    // the last name if no other has it.
    std::string of(std::string const& vin);

private:
    void write(std::string const& name, std::string const& text) const;

    std::filesystem::path const m_folder;
};

} // namespace velmora
