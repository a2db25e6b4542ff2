#pragma once

#include <velmora/export.h>
#include <velmora/print.h>
#include <velmora/report.h>

#include <chrono>
#include <cstdint>
#include <iosfwd>
#include <memory>
#include <optional>
#include <string>
#include <vector>

/// Scans that are kept, and what changed from one to the next.

namespace velmora {

/// One scan of a vehicle as the history keeps it.
struct KeptScan
{
    std::int64_t number = 0; ///< as people name it; 0 for one that is not kept yet
    std::string vehicle;     ///< its identification number, or the name that its owner gave it
    std::chrono::sys_time<std::chrono::milliseconds> time; ///< when it was made
    std::string program;                                   ///< version that made it
    std::string hash;                                      ///< sixteen hexadecimal digits that tell documents apart
    std::string document;                                  ///< the report as VehicleReport::toJson has it, on one line
};

/// What one looks for in a list of scans.
struct ScanFacts
{
    std::optional<bool> lamp;       ///< whether it was on at any module; empty if none told
    std::vector<std::string> codes; ///< confirmed and permanent ones, each once
    std::size_t modules = 0;        ///< how many were there
};

/// The scan of a report, by the identification number that the modules tell, else by the owner's name of the vehicle.
/// program: what made it, with its version. Throws Error if there is neither number nor name.
VELMORA_EXPORT KeptScan makeScan(VehicleReport const& report, std::string const& vehicle,
                                 std::chrono::sys_time<std::chrono::milliseconds> time, std::string const& program);
/// The report that was kept. Throws Error if it can't be read.
VELMORA_EXPORT VehicleReport reportOf(KeptScan const& scan);
/// What a list shows of a scan. Throws Error if its report can't be read.
VELMORA_EXPORT ScanFacts factsOf(KeptScan const& scan);
/// The scan without its report, as one object of JSON: number, vehicle, time, program, and the facts.
VELMORA_EXPORT std::string toJson(KeptScan const& scan);

/// The vehicles, and below each its scans: number, local time, lamp and codes.
VELMORA_EXPORT std::string toText(std::vector<KeptScan> const& scans, TextStyle const& style);

/// The scans of all vehicles in a file of the user's, which nobody else may read. One thread. In a build without it,
/// all throws Error.
class VELMORA_EXPORT History
{
public:
    /// What is to be done with the file.
    enum class Access
    {
        Keep, ///< makes file and folder where there are none
        Look, ///< a file that does not exist holds nothing
    };

    /// How many scans of an exported file there were.
    struct Imported
    {
        std::size_t added = 0; ///< that were not kept before
        std::size_t known = 0; ///< that were
    };

    /// Opens defaultFile(). Throws Error for a file that can't be used, or is something else.
    explicit History(Access access);
    /// Opens that file.
    History(std::string const& file, Access access);
    ~History();
    History(History const&) = delete;
    History& operator=(History const&) = delete;

    /// The scan's number; nothing if the same one is kept already: of that vehicle, time and hash. Throws Error.
    std::optional<std::int64_t> add(KeptScan const& scan);

    /// The oldest first, of one vehicle or, for an empty name, of all. Throws Error.
    std::vector<KeptScan> scans(std::string const& vehicle = {}) const;
    /// Throws Error for a number that there is not.
    KeptScan scan(std::int64_t number) const;
    /// Drops all of a vehicle, so that the file holds nothing of it any more, and tells how many scans that were.
    /// Throws Error, also if there are none.
    std::size_t forget(std::string const& vehicle);

    /// Writes a line a scan, the oldest first, and tells how many. Throws Error if it can't be written.
    std::size_t exportTo(std::ostream& out) const;
    /// Takes all lines of an export or none. Throws Error that names the line which is none.
    Imported importFrom(std::istream& in);

    /// VELMORA_HISTORY of the environment, else velmora/history.db in the user's data folder: XDG_DATA_HOME, or
    /// .local/share in HOME.
    static std::string defaultFile();

private:
    struct Parts;
    std::unique_ptr<Parts> m_parts;
};

/// Whether a change is for the better.
enum class ChangeWeight : std::uint8_t
{
    Neutral, ///< neither
    Better,  ///< a code has gone, say
    Worse,   ///< see changesBetween
};

/// One thing that two scans of a vehicle tell differently.
struct Change
{
    std::string kind;    ///< the same in all versions: "code-new"
    ChangeWeight weight; ///< whether it is for the better
    std::string module;  ///< "7E8 ECM"; empty for the vehicle
    std::string what;    ///< "confirmed code", "monitor", ...
    std::string name;    ///< which one
    std::string before;  ///< what the older scan told
    std::string after;   ///< what the newer one told
};

/// What changed. Only what both scans told is compared: a list that a module did not tell once is neither new nor gone.
/// Worse are a new confirmed or permanent code, a lamp that came on, a monitor that is no longer complete though
/// nothing was cleared, and a test result that has left its limits.
VELMORA_EXPORT std::vector<Change> changesBetween(VehicleReport const& older, VehicleReport const& newer);
/// Whether anything got worse.
VELMORA_EXPORT bool hasWorse(std::vector<Change> const& changes);
/// Whether codes were cleared between the scans: something that is counted since then counts less than before. A count
/// that stands at the end of its range tells nothing.
VELMORA_EXPORT bool wereCleared(VehicleReport const& older, VehicleReport const& newer);
/// Both scans, and what changed between them.
VELMORA_EXPORT std::string toText(KeptScan const& older, KeptScan const& newer, std::vector<Change> const& changes,
                                  TextStyle const& style);
/// A list of JSON, with an object for each change.
VELMORA_EXPORT std::string toJson(std::vector<Change> const& changes);

} // namespace velmora
