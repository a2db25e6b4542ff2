#pragma once

#include <string>

namespace velmora {

// The current of a wide range oxygen sensor (PIDs 34 to 3B, second sensor). The library's formula has no offset; SAE
// J1979 has 0 mA in the middle of the range, where the mixture is stoichiometric, so what people are shown is 128 mA
// less. This is the one place where companion and library differ.
bool isOxygenCurrent(int uid);

// What people are shown of a number of the library: the same for every other sensor.
double shownNumber(int uid, double number);
int shownNumber(int uid, int number);

// The same for the library's text of a number, with as many decimals.
std::string shownText(int uid, std::string const& text);

} // namespace velmora
