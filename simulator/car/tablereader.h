#pragma once

#include "simulator/bytes.h"
#include "simulator/toml.h"

#include <functional>
#include <set>
#include <string>

namespace obdsim {

/// Reads one table of a vehicle file key by key. Whatever does not fit throws
/// VehicleFileError with file and line; finish() does so for keys that nobody
/// asked for, which are typing errors.
class TableReader
{
public:
    TableReader(toml::table const& table, std::string origin, std::string title);

    bool has(std::string_view key);

    std::string text(std::string_view key);
    std::string text(std::string_view key, std::string const& otherwise);
    bool flag(std::string_view key, bool otherwise);
    double number(std::string_view key, double otherwise);
    int integer(std::string_view key, int lowest, int highest);
    int integer(std::string_view key, int lowest, int highest, int otherwise);

    /// Bytes written as a text of hexadecimal digits; empty if the key is missing.
    Bytes bytes(std::string_view key);

    /// A single byte of hexadecimal digits.
    std::uint8_t byte(std::string_view key);

    std::vector<std::string> texts(std::string_view key);
    std::vector<std::uint16_t> words(std::string_view key);

    /// Calls `read` with the table at `key`, if it is there, and then finishes it.
    void table(std::string_view key, std::function<void(TableReader&)> const& read);

    /// The same for each table of an array.
    void tables(std::string_view key, std::function<void(TableReader&)> const& read);

    /// For tables whose keys are hexadecimal bytes: each key with its value,
    /// which is one text or an array of texts.
    void entries(std::function<void(Bytes const& key, std::vector<Bytes> const& values)> const& read);

    /// The same for keys with a table behind each.
    void tableEntries(std::function<void(Bytes const& key, TableReader& value)> const& read);

    void finish();

    [[noreturn]] void fail(std::string_view key, std::string const& what) const;

private:
    toml::node const* find(std::string_view key);
    toml::node const& need(std::string_view key);
    toml::array const& array(std::string_view key, std::string const& ofWhat);
    Bytes keyBytes(toml::key const& key);
    Bytes hex(toml::node const& node) const;
    std::string string(toml::node const& node, std::string_view key) const;
    [[noreturn]] void failAt(toml::node const& node, std::string const& what) const;

    toml::table const& m_table;
    std::string m_origin;
    std::string m_title;
    std::set<std::string, std::less<>> m_known;
};

} // namespace obdsim
