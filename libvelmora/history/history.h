#pragma once

#include "libvelmora/history/keptscan.h"
#include "libvelmora/output/database/database.h"

#include <filesystem>
#include <iosfwd>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// The scans of all vehicles in a file of the user's, which nobody else may read. For one thread.
class History
{
public:
    enum class Access
    {
        Keep, // makes file and folder where there are none
        Look, // a file that does not exist holds nothing
    };

    // Throws Error for a file that can't be used, or is something else.
    History(std::filesystem::path const& file, Access access);

    // The scan's number; nothing if the same one is kept already: of that vehicle, time and hash. Throws Error.
    std::optional<std::int64_t> add(KeptScan const& scan);

    // The oldest first, of one vehicle or of all. Throws Error.
    std::vector<KeptScan> scans(std::string const& vehicle = {}) const;
    // Throws Error for a number that there is not.
    KeptScan scan(std::int64_t number) const;
    // Drops all of a vehicle, so that the file holds nothing of it any more, and tells how many scans that were. Throws
    // Error.
    std::size_t forget(std::string const& vehicle);

    struct Imported
    {
        std::size_t added = 0;
        std::size_t known = 0;
    };

    // A line a scan, the oldest first. Throws Error if it can't be written.
    std::size_t exportTo(std::ostream& out) const;
    // All of them or none. Throws Error that names the line which is none of an export.
    Imported importFrom(std::istream& in);

    // VELMORA_HISTORY, else velmora/history.db in the user's data folder: XDG_DATA_HOME, or .local/share in HOME.
    static std::filesystem::path defaultFile();

private:
    void prepare();

    std::filesystem::path const m_file;
    std::unique_ptr<Database> m_database; // null where there is no file to look into
};

} // namespace velmora
