#include "libvelmora/history/scanjson.h"
#include "libvelmora/output/database/database.h"
#include "libvelmora/session/userfolders.h"

#include <velmora/error.h>
#include <velmora/history.h>

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <istream>
#include <ostream>
#include <sys/stat.h>

namespace velmora {

namespace {

constexpr int historyVersion = 1;
constexpr int historyApplicationId = 0x766C6D68; // "vlmh"
constexpr std::size_t longestLine = 16U << 20;

// A number is never used again, so that one that was told stays that of its scan. What is dropped is overwritten.
constexpr char const* historySchema = R"(
CREATE TABLE scan (
    number   INTEGER PRIMARY KEY AUTOINCREMENT,
    vehicle  TEXT NOT NULL,
    time     INTEGER NOT NULL,
    program  TEXT NOT NULL,
    hash     TEXT NOT NULL,
    document TEXT NOT NULL,
    UNIQUE (vehicle, time, hash)
) STRICT;
)";

KeptScan scanAt(Statement const& row)
{
    using namespace std::chrono;
    return {row.number(0), row.text(1), sys_time<milliseconds>(milliseconds(row.number(2))),
            row.text(3),   row.text(4), row.text(5)};
}

constexpr char const* scanColumns = "SELECT number, vehicle, time, program, hash, document FROM scan ";

void makeFolderOf(std::filesystem::path const& file)
{
    std::error_code error;
    std::filesystem::path const whole = std::filesystem::absolute(file, error);
    if (!error) {
        std::filesystem::create_directories(whole.parent_path(), error);
    }
    if (error) {
        throw Error(ErrorKind::Failed, "Could not make the folder of \"" + file.string() + "\": " + error.message(),
                    {"VELMORA_HISTORY=FILE names another place"});
    }
}

bool stands(std::filesystem::path const& file)
{
    std::error_code error;
    bool const found = std::filesystem::exists(file, error);
    if (error) {
        throw Error(ErrorKind::Failed, "Could not read " + file.string() + ": " + error.message(),
                    {"may you read its folder? VELMORA_HISTORY=FILE names another place"});
    }
    return found;
}

} // namespace

struct History::Parts
{
    Parts(std::filesystem::path path, Access access);

    void prepare();
    bool isEmpty() { return database->number("SELECT count(*) FROM sqlite_schema") == 0; }

    std::filesystem::path const file;
    std::unique_ptr<Database> database; // null where there is no file to look into
};

History::Parts::Parts(std::filesystem::path path, Access access) : file(std::move(path))
{
    if (access == Access::Look && !stands(file)) {
        return;
    }
    if (access == Access::Keep) {
        makeFolderOf(file);
    }
    database = std::make_unique<Database>(file.string(), access == Access::Keep ? Database::Access::Write
                                                                                : Database::Access::ReadOnly);
    if (access == Access::Keep) {
        ::chmod(file.c_str(), S_IRUSR | S_IWUSR); // a file from elsewhere may have been open to all
    }
    prepare();
}

void History::Parts::prepare()
{
    if (isEmpty()) {
        Transaction transaction(*database);
        if (isEmpty()) { // still: another process may have kept its first scan meanwhile
            database->execute(historySchema);
            database->execute("PRAGMA application_id=" + std::to_string(historyApplicationId));
            database->execute("PRAGMA user_version=" + std::to_string(historyVersion));
        }
        transaction.commit();
    }
    if (database->number("PRAGMA application_id") != historyApplicationId) {
        throw Error(ErrorKind::WrongUse, file.string() + " is the database of another program",
                    {"VELMORA_HISTORY=FILE names another file"});
    }
    if (database->number("PRAGMA user_version") != historyVersion) {
        throw Error(ErrorKind::WrongUse, file.string() + " was made by another version of this program",
                    {"VELMORA_HISTORY=FILE names another file"});
    }
}

History::History(Access access) : History(defaultFile(), access) {}

History::History(std::string const& file, Access access) : m_parts(std::make_unique<Parts>(file, access)) {}

History::~History() = default;

std::optional<std::int64_t> History::add(KeptScan const& scan)
{
    // One that is ignored for its key would use up a number.
    Statement insert(*m_parts->database,
                     "INSERT INTO scan (vehicle, time, program, hash, document) SELECT ?1, ?2, ?3, ?4, ?5 "
                     "WHERE NOT EXISTS (SELECT 1 FROM scan WHERE vehicle = ?1 AND time = ?2 AND hash = ?4)");
    insert.bind(1, scan.vehicle);
    insert.bind(2, std::int64_t{scan.time.time_since_epoch().count()});
    insert.bind(3, scan.program);
    insert.bind(4, scan.hash);
    insert.bind(5, scan.document);
    insert.run();
    bool const added = m_parts->database->number("SELECT changes()") > 0;
    return added ? std::optional(m_parts->database->number("SELECT last_insert_rowid()")) : std::nullopt;
}

std::vector<KeptScan> History::scans(std::string const& vehicle) const
{
    std::vector<KeptScan> list;
    if (m_parts->database == nullptr) {
        return list;
    }
    Statement rows(*m_parts->database,
                   std::string(scanColumns) + "WHERE ?1 = '' OR vehicle = ?1 ORDER BY time, number");
    rows.bind(1, vehicle);
    while (rows.next()) {
        list.push_back(scanAt(rows));
    }
    return list;
}

KeptScan History::scan(std::int64_t number) const
{
    if (m_parts->database != nullptr) {
        Statement rows(*m_parts->database, std::string(scanColumns) + "WHERE number = ?");
        rows.bind(1, number);
        if (rows.next()) {
            return scanAt(rows);
        }
    }
    throw Error(ErrorKind::WrongUse, "There is no scan " + std::to_string(number) + " in " + m_parts->file.string(),
                {"velmora history lists those there are"});
}

std::size_t History::forget(std::string const& vehicle)
{
    std::size_t const count = scans(vehicle).size();
    if (count == 0) {
        throw Error(ErrorKind::WrongUse, "Nothing is kept of " + vehicle, {"velmora history lists the vehicles"});
    }
    m_parts->database->execute("PRAGMA secure_delete=ON");
    Statement drop(*m_parts->database, "DELETE FROM scan WHERE vehicle = ?");
    drop.bind(1, vehicle);
    drop.run();
    m_parts->database->execute("VACUUM");
    m_parts->database->checkpoint();
    return count;
}

std::size_t History::exportTo(std::ostream& out) const
{
    std::vector<KeptScan> const list = scans();
    for (KeptScan const& scan : list) {
        out << toLine(scan);
    }
    if (!out.flush()) {
        throw Error(ErrorKind::Failed, "Could not write the export", {"is there room on the disk?"});
    }
    return list.size();
}

History::Imported History::importFrom(std::istream& in)
{
    Transaction transaction(*m_parts->database);
    Imported result;
    std::string line;
    for (std::size_t number = 1; std::getline(in, line); ++number) {
        if (line.empty()) {
            continue;
        }
        try {
            if (line.size() > longestLine) {
                throw Error(ErrorKind::Failed, "too long");
            }
            add(parseLine(line)) ? ++result.added : ++result.known;
        } catch (Error const& error) {
            throw Error(error.kind(), "Line " + std::to_string(number) + ": " + error.what() + ". Nothing was imported",
                        error.hints());
        }
    }
    if (in.bad()) {
        throw Error(ErrorKind::Failed, std::string("Could not read the file: ") + std::strerror(errno));
    }
    transaction.commit();
    return result;
}

std::string History::defaultFile()
{
    char const* const file = std::getenv("VELMORA_HISTORY");
    return file != nullptr && *file != '\0' ? std::string(file) : (userDataFolder() / "history.db").string();
}

} // namespace velmora
