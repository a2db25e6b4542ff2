#pragma once

#include <string>

namespace obd {

/// How a number becomes text.
class IValueFormater
{
public:
    virtual ~IValueFormater() = default;

    virtual std::string toString(double value) const = 0;
};

} // namespace obd
