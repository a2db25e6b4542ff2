#pragma once

#include <charconv>
#include <cmath>
#include <optional>
#include <string>

namespace obdsim {

/// A decimal number such as "11.8", whatever the locale; nothing for any other text and for what is not finite.
inline std::optional<double> parseDecimal(std::string const& text)
{
    double value = 0;
    char const* const end = text.data() + text.size();
    auto const result = std::from_chars(text.data(), end, value);
    bool const whole = result.ec == std::errc() && result.ptr == end && std::isfinite(value);
    return whole ? std::optional<double>(value) : std::nullopt;
}

} // namespace obdsim
