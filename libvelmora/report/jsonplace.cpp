#include "libvelmora/report/jsonplace.h"

#include <velmora/error.h>

#include <algorithm>
#include <charconv>
#include <cmath>
#include <string_view>

namespace velmora {

void JsonPlace::fail(std::string const& expected) const
{
    throw Error(ErrorKind::Failed, "The report has no " + expected + " at " + (m_path.empty() ? "/" : m_path),
                {"was it written by another version of this program, or changed since?"});
}

JsonPlace JsonPlace::at(char const* member) const
{
    auto const found = m_value.is_object() ? m_value.find(member) : m_value.end();
    if (!m_value.is_object() || found == m_value.end()) {
        fail(std::string("member \"") + member + "\"");
    }
    return JsonPlace(*found, m_path + "/" + member);
}

std::optional<JsonPlace> JsonPlace::find(char const* member) const
{
    if (!m_value.is_object()) {
        fail("object");
    }
    auto const found = m_value.find(member);
    if (found == m_value.end() || found->is_null()) {
        return std::nullopt;
    }
    return JsonPlace(*found, m_path + "/" + member);
}

std::vector<JsonPlace> JsonPlace::elements() const
{
    if (!m_value.is_array()) {
        fail("list");
    }
    std::vector<JsonPlace> list;
    list.reserve(m_value.size());
    for (std::size_t i = 0; i < m_value.size(); ++i) {
        list.emplace_back(m_value[i], m_path + "/" + std::to_string(i));
    }
    return list;
}

std::string JsonPlace::text() const
{
    if (!m_value.is_string()) {
        fail("text");
    }
    return m_value.get<std::string>();
}

std::string JsonPlace::textOrEmpty() const
{
    return isNull() ? std::string() : text();
}

bool JsonPlace::boolean() const
{
    if (!m_value.is_boolean()) {
        fail("true or false");
    }
    return m_value.get<bool>();
}

std::optional<bool> JsonPlace::booleanOrNothing() const
{
    return isNull() ? std::nullopt : std::optional(boolean());
}

double JsonPlace::number() const
{
    if (!m_value.is_number()) {
        fail("number");
    }
    return m_value.get<double>();
}

std::uint32_t JsonPlace::whole(std::uint32_t largest) const
{
    // What is below 0 becomes more than any.
    if (!m_value.is_number_integer() || m_value.get<std::uint64_t>() > largest) {
        fail("whole number up to " + std::to_string(largest));
    }
    return m_value.get<std::uint32_t>();
}

std::uint32_t JsonPlace::hex() const
{
    std::string const digits = text();
    std::uint32_t number = 0;
    auto const [end, error] = std::from_chars(digits.data(), digits.data() + digits.size(), number, 16);
    if (error != std::errc() || end != digits.data() + digits.size()) {
        fail("hexadecimal number");
    }
    return number;
}

std::size_t JsonPlace::wordOf(std::span<char const* const> words) const
{
    std::string const word = text();
    auto const found =
        std::find_if(words.begin(), words.end(), [&word](char const* each) { return std::string_view(each) == word; });
    if (found == words.end()) {
        fail("known word");
    }
    return static_cast<std::size_t>(found - words.begin());
}

} // namespace velmora
