#include "simulator/car/tablereader.h"

#include "simulator/car/vehiclefile.h"

namespace obdsim {

namespace {

std::string place(std::string const& origin, toml::source_region const& source)
{
    return origin + ":" + std::to_string(source.begin.line) + ": ";
}

std::string quoted(std::string_view text)
{
    return "\"" + std::string(text) + "\"";
}

} // namespace

TableReader::TableReader(toml::table const& table, std::string origin, std::string title)
    : m_table(table), m_origin(std::move(origin)), m_title(std::move(title))
{}

bool TableReader::has(std::string_view key)
{
    return find(key) != nullptr;
}

std::string TableReader::text(std::string_view key)
{
    return string(need(key), key);
}

std::string TableReader::text(std::string_view key, std::string const& otherwise)
{
    toml::node const* node = find(key);
    return node == nullptr ? otherwise : string(*node, key);
}

bool TableReader::flag(std::string_view key, bool otherwise)
{
    toml::node const* node = find(key);
    if (node == nullptr) {
        return otherwise;
    }
    if (!node->is_boolean()) {
        failAt(*node, quoted(key) + " must be true or false");
    }
    return node->ref<bool>();
}

double TableReader::number(std::string_view key, double otherwise)
{
    toml::node const* node = find(key);
    if (node == nullptr) {
        return otherwise;
    }
    auto const value = node->value<double>();
    if (!value) {
        failAt(*node, quoted(key) + " must be a number");
    }
    return *value;
}

int TableReader::integer(std::string_view key, int lowest, int highest)
{
    toml::node const& node = need(key);
    auto const value = node.is_integer() ? node.value<std::int64_t>() : std::nullopt;
    if (!value || *value < lowest || *value > highest) {
        failAt(node, quoted(key) + " must be a whole number from " + std::to_string(lowest) + " to " +
                         std::to_string(highest));
    }
    return static_cast<int>(*value);
}

int TableReader::integer(std::string_view key, int lowest, int highest, int otherwise)
{
    return has(key) ? integer(key, lowest, highest) : otherwise;
}

Bytes TableReader::bytes(std::string_view key)
{
    toml::node const* node = find(key);
    return node == nullptr ? Bytes{} : hex(*node);
}

std::uint8_t TableReader::byte(std::string_view key)
{
    toml::node const& node = need(key);
    Bytes const value = hex(node);
    if (value.size() != 1) {
        failAt(node, quoted(key) + " must be one byte of two hexadecimal digits");
    }
    return value[0];
}

std::vector<std::string> TableReader::texts(std::string_view key)
{
    std::vector<std::string> result;
    for (auto const& element : array(key, "texts")) {
        result.push_back(string(element, key));
    }
    return result;
}

std::vector<std::uint16_t> TableReader::words(std::string_view key)
{
    std::vector<std::uint16_t> result;
    for (auto const& element : array(key, "numbers")) {
        auto const value = element.is_integer() ? element.value<std::int64_t>() : std::nullopt;
        if (!value || *value < 0 || *value > 0xFFFF) {
            failAt(element, quoted(key) + " must hold whole numbers from 0 to 65535");
        }
        result.push_back(static_cast<std::uint16_t>(*value));
    }
    return result;
}

void TableReader::table(std::string_view key, std::function<void(TableReader&)> const& read)
{
    toml::node const* node = find(key);
    if (node == nullptr) {
        return;
    }
    if (!node->is_table()) {
        failAt(*node, quoted(key) + " must be a table");
    }
    TableReader reader(*node->as_table(), m_origin, std::string(key));
    read(reader);
    reader.finish();
}

void TableReader::tables(std::string_view key, std::function<void(TableReader&)> const& read)
{
    for (auto const& element : array(key, "tables")) {
        if (!element.is_table()) {
            failAt(element, quoted(key) + " must be an array of tables");
        }
        TableReader reader(*element.as_table(), m_origin, std::string(key));
        read(reader);
        reader.finish();
    }
}

void TableReader::entries(std::function<void(Bytes const&, std::vector<Bytes> const&)> const& read)
{
    for (auto const& [key, node] : m_table) {
        std::vector<Bytes> values;
        if (toml::array const* array = node.as_array()) {
            for (auto const& element : *array) {
                values.push_back(hex(element));
            }
        } else {
            values.push_back(hex(node));
        }
        read(keyBytes(key), values);
    }
}

void TableReader::tableEntries(std::function<void(Bytes const&, TableReader&)> const& read)
{
    for (auto const& [key, node] : m_table) {
        if (!node.is_table()) {
            failAt(node, quoted(key.str()) + " must be a table");
        }
        TableReader reader(*node.as_table(), m_origin, std::string(key.str()));
        read(keyBytes(key), reader);
        reader.finish();
    }
}

void TableReader::finish()
{
    for (auto const& [key, node] : m_table) {
        if (!m_known.contains(key.str())) {
            throw VehicleFileError(place(m_origin, key.source()) + "unknown key " + quoted(key.str()) + " in " +
                                   m_title);
        }
    }
}

void TableReader::fail(std::string_view key, std::string const& what) const
{
    toml::node const* node = m_table.get(key);
    failAt(node == nullptr ? m_table : *node, what);
}

toml::node const* TableReader::find(std::string_view key)
{
    m_known.emplace(key);
    return m_table.get(key);
}

toml::node const& TableReader::need(std::string_view key)
{
    toml::node const* node = find(key);
    if (node == nullptr) {
        failAt(m_table, m_title + " needs " + quoted(key));
    }
    return *node;
}

/// The array at `key`, an empty one if the key is missing.
toml::array const& TableReader::array(std::string_view key, std::string const& ofWhat)
{
    static toml::array const none;
    toml::node const* node = find(key);
    if (node != nullptr && !node->is_array()) {
        failAt(*node, quoted(key) + " must be an array of " + ofWhat);
    }
    return node == nullptr ? none : *node->as_array();
}

Bytes TableReader::keyBytes(toml::key const& key)
{
    m_known.emplace(key.str());
    auto const value = parseHex(key.str());
    if (!value || value->empty()) {
        throw VehicleFileError(place(m_origin, key.source()) + "the key " + quoted(key.str()) +
                               " must be bytes in hexadecimal digits");
    }
    return *value;
}

Bytes TableReader::hex(toml::node const& node) const
{
    auto const value = node.is_string() ? parseHex(node.ref<std::string>()) : std::nullopt;
    if (!value) {
        failAt(node, "bytes must be a text of pairs of hexadecimal digits");
    }
    return *value;
}

std::string TableReader::string(toml::node const& node, std::string_view key) const
{
    if (!node.is_string()) {
        failAt(node, quoted(key) + " must be a text");
    }
    return node.ref<std::string>();
}

void TableReader::failAt(toml::node const& node, std::string const& what) const
{
    throw VehicleFileError(place(m_origin, node.source()) + what);
}

} // namespace obdsim
