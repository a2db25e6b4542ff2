#pragma once

#include "libvelmora/report/json.h"

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

namespace velmora {

// A value of a document from anywhere, with the place where it stands, for messages. Everything that a document might
// lack or have otherwise is an Error (failed) that names the place. The document must outlive it.
class JsonPlace
{
public:
    explicit JsonPlace(Json const& value, std::string path = {}) : m_value(value), m_path(std::move(path)) {}

    // A member that must be there.
    JsonPlace at(char const* member) const;
    // One that need not be there; nothing also for null.
    std::optional<JsonPlace> find(char const* member) const;
    std::vector<JsonPlace> elements() const;

    bool isNull() const { return m_value.is_null(); }
    std::string text() const;
    std::string textOrEmpty() const; // for null
    bool boolean() const;
    std::optional<bool> booleanOrNothing() const;
    double number() const;
    // A whole number from 0 to the largest that may stand there.
    std::uint32_t whole(std::uint32_t largest) const;
    // The number that the text is in hexadecimal.
    std::uint32_t hex() const;
    // Which of the words the text is.
    std::size_t wordOf(std::span<char const* const> words) const;

    [[noreturn]] void fail(std::string const& expected) const;

private:
    Json const& m_value;
    std::string m_path;
};

} // namespace velmora
