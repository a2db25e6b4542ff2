#pragma once

namespace obd::unitconversion {

// From the stored metric value to the imperial one. The constants are what users see to the last digit: keep them, and
// the order of the operations.
constexpr double celsiusToFahrenheit(double celsius)
{
    return celsius * 1.8 + 32.0;
}

constexpr double kilopascalToPsi(double kilopascal)
{
    return kilopascal * 0.1450377;
}

constexpr double kilopascalToInchHg(double kilopascal)
{
    return kilopascal * 0.295300586467;
}

constexpr double kilopascalToInchH2O(double kilopascal)
{
    return kilopascal * 4.01463092093;
}

constexpr double pascalToInchH2O(double pascal)
{
    return pascal * 0.00401463092093;
}

constexpr double gramPerSecondToPoundPerMinute(double gramPerSecond)
{
    return gramPerSecond * 0.132277357;
}

// Of a distance, and so of a speed too.
constexpr double kilometreToMile(double kilometre)
{
    return kilometre * 0.62137;
}

constexpr double kilowattToHorsepower(double kilowatt)
{
    return kilowatt * 1.3410220888;
}

} // namespace obd::unitconversion
