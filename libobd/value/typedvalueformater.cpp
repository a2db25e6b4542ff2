#include <obd/typedvalueformater.h>

#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <iomanip>
#include <locale>
#include <sstream>

namespace obd {
namespace {

// Up to here a count of last digits and its quotient by the scale are the same text.
constexpr double mostSteps = 1125899906842624.0; // 2^50

// Each reading is written several times, and a stream costs more than all else that is done for one. steps counts the
// last digit.
std::string plainText(std::int64_t steps, std::size_t decimals)
{
    std::array<char, 24> digits{};
    std::to_chars_result const end =
        std::to_chars(digits.data(), digits.data() + digits.size(), steps < 0 ? -steps : steps);
    std::string text(digits.data(), end.ptr);
    if (text.size() <= decimals) {
        text.insert(0, decimals + 1 - text.size(), '0');
    }
    if (decimals > 0) {
        text.insert(text.size() - decimals, 1, '.');
    }
    return steps < 0 ? "-" + text : text;
}

} // namespace

TypedValueFormater::TypedValueFormater(int decimals)
    : m_decimals(decimals), m_scale(static_cast<int>(std::pow(10.0, decimals)))
{}

double TypedValueFormater::fixPrecision(double value) const
{
    // Not std::round: halves go up for negative values too, so that steps on either side of 0 are equally wide.
    return std::floor(m_scale * value + 0.5) / m_scale;
}

std::string TypedValueFormater::toString(double value) const
{
    double const steps = std::floor(m_scale * value + 0.5); // as fixPrecision counts them
    // The locale is that of the application, whose users these texts are for.
    if (std::abs(steps) < mostSteps && std::locale() == std::locale::classic()) {
        return plainText(static_cast<std::int64_t>(steps), static_cast<std::size_t>(m_decimals));
    }
    std::ostringstream text;
    text << std::fixed << std::setprecision(m_decimals) << fixPrecision(value);
    return text.str();
}

} // namespace obd
