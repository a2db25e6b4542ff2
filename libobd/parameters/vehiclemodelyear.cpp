#include <obd/vehiclemodelyear.h>

namespace obd {
namespace {

constexpr std::size_t vinLength = 17;
constexpr std::size_t yearPosition = 9;

struct YearRow
{
    char character;
    int year;
};

constexpr YearRow years[] = {
    {'A', 2010}, {'B', 2011}, {'C', 2012}, {'D', 2013}, {'E', 2014}, {'F', 2015}, {'G', 2016}, {'H', 2017},
    {'J', 2018}, {'K', 2019}, {'L', 2020}, {'M', 2021}, {'N', 2022}, {'P', 2023}, {'R', 2024}, {'S', 2025},
    {'T', 1996}, {'V', 1997}, {'W', 1998}, {'X', 1999}, {'Y', 2000}, {'1', 2001}, {'2', 2002}, {'3', 2003},
    {'4', 2004}, {'5', 2005}, {'6', 2006}, {'7', 2007}, {'8', 2008}, {'9', 2009},
};

} // namespace

int GetVehicleModelYear(std::string const& vin)
{
    if (vin.size() != vinLength) {
        return 0;
    }
    for (YearRow const& row : years) {
        if (row.character == vin[yearPosition]) {
            return row.year;
        }
    }
    return 0;
}

} // namespace obd
