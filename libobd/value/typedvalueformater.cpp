#include <obd/typedvalueformater.h>

#include <cmath>
#include <iomanip>
#include <sstream>

namespace obd {

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
    // The stream keeps the locale of the application, whose users these texts are for.
    std::ostringstream text;
    text << std::fixed << std::setprecision(m_decimals) << fixPrecision(value);
    return text.str();
}

} // namespace obd
