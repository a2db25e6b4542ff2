#include "simulator/car/tablereader.h"

#include "simulator/car/vehiclefile.h"

namespace obdsim {

namespace {

std::string place(const std::string& origin, const toml::source_region& source)
{
    return origin + ":" + std::to_string(source.begin.line) + ": ";
}

std::string quoted(std::string_view text)
{
    return "\"" + std::string(text) + "\"";
}

} // namespace

TableReader::TableReader(const toml::table& table, std::string origin, std::string title)
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

std::string TableReader::text(std::string_view key, const std::string& otherwise)
{
    const toml::node* node = find(key);
    return node == nullptr ? otherwise : string(*node, key);
}

bool TableReader::flag(std::string_view key, bool otherwise)
{
    const toml::node* node = find(key);
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
    const toml::node* node = find(key);
    if (node == nullptr) {
        return otherwise;
    }
    const auto value = node->value<double>();
    if (!value) {
        failAt(*node, quoted(key) + " must be a number");
    }
    return *value;
}

int TableReader::integer(std::string_view key, int lowest, int highest)
{
    const toml::node& node = need(key);
    const auto value = node.is_integer() ? node.value<std::int64_t>() : std::nullopt;
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
    const toml::node* node = find(key);
    return node == nullptr ? Bytes{} : hex(*node);
}

std::uint8_t TableReader::byte(std::string_view key)
{
    const toml::node& node = need(key);
    const Bytes value = hex(node);
    if (value.size() != 1) {
        failAt(node, quoted(key) + " must be one byte of two hexadecimal digits");
    }
    return value[0];
}

std::vector<std::string> TableReader::texts(std::string_view key)
{
    std::vector<std::string> result;
    const toml::node* node = find(key);
    if (node == nullptr) {
        return result;
    }
    const toml::array* array = node->as_array();
    if (array == nullptr) {
        failAt(*node, quoted(key) + " must be an array of texts");
    }
    for (const auto& element : *array) {
        result.push_back(string(element, key));
    }
    return result;
}

std::vector<std::uint16_t> TableReader::words(std::string_view key)
{
    std::vector<std::uint16_t> result;
    const toml::node* node = find(key);
    if (node == nullptr) {
        return result;
    }
    const toml::array* array = node->as_array();
    if (array == nullptr) {
        failAt(*node, quoted(key) + " must be an array of numbers");
    }
    for (const auto& element : *array) {
        const auto value = element.is_integer() ? element.value<std::int64_t>() : std::nullopt;
        if (!value || *value < 0 || *value > 0xFFFF) {
            failAt(element, quoted(key) + " must hold whole numbers from 0 to 65535");
        }
        result.push_back(static_cast<std::uint16_t>(*value));
    }
    return result;
}

void TableReader::table(std::string_view key, const std::function<void(TableReader&)>& read)
{
    const toml::node* node = find(key);
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

void TableReader::tables(std::string_view key, const std::function<void(TableReader&)>& read)
{
    const toml::node* node = find(key);
    if (node == nullptr) {
        return;
    }
    if (!node->is_array()) {
        failAt(*node, quoted(key) + " must be an array of tables");
    }
    for (const auto& element : *node->as_array()) {
        if (!element.is_table()) {
            failAt(element, quoted(key) + " must be an array of tables");
        }
        TableReader reader(*element.as_table(), m_origin, std::string(key));
        read(reader);
        reader.finish();
    }
}

void TableReader::entries(const std::function<void(const Bytes&, const std::vector<Bytes>&)>& read)
{
    for (const auto& [key, node] : m_table) {
        std::vector<Bytes> values;
        if (const toml::array* array = node.as_array()) {
            for (const auto& element : *array) {
                values.push_back(hex(element));
            }
        } else {
            values.push_back(hex(node));
        }
        read(keyBytes(key), values);
    }
}

void TableReader::tableEntries(const std::function<void(const Bytes&, TableReader&)>& read)
{
    for (const auto& [key, node] : m_table) {
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
    for (const auto& [key, node] : m_table) {
        if (!m_known.contains(key.str())) {
            throw VehicleFileError(place(m_origin, key.source()) + "unknown key " + quoted(key.str()) + " in " +
                                   m_title);
        }
    }
}

void TableReader::fail(std::string_view key, const std::string& what) const
{
    const toml::node* node = m_table.get(key);
    failAt(node == nullptr ? m_table : *node, what);
}

const toml::node* TableReader::find(std::string_view key)
{
    m_known.emplace(key);
    return m_table.get(key);
}

const toml::node& TableReader::need(std::string_view key)
{
    const toml::node* node = find(key);
    if (node == nullptr) {
        failAt(m_table, m_title + " needs " + quoted(key));
    }
    return *node;
}

Bytes TableReader::keyBytes(const toml::key& key)
{
    m_known.emplace(key.str());
    const auto value = parseHex(key.str());
    if (!value || value->empty()) {
        throw VehicleFileError(place(m_origin, key.source()) + "the key " + quoted(key.str()) +
                               " must be bytes in hexadecimal digits");
    }
    return *value;
}

Bytes TableReader::hex(const toml::node& node) const
{
    const auto value = node.is_string() ? parseHex(node.ref<std::string>()) : std::nullopt;
    if (!value) {
        failAt(node, "bytes must be a text of pairs of hexadecimal digits");
    }
    return *value;
}

std::string TableReader::string(const toml::node& node, std::string_view key) const
{
    if (!node.is_string()) {
        failAt(node, quoted(key) + " must be a text");
    }
    return node.ref<std::string>();
}

void TableReader::failAt(const toml::node& node, const std::string& what) const
{
    throw VehicleFileError(place(m_origin, node.source()) + what);
}

} // namespace obdsim
