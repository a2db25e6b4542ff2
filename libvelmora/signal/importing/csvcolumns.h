#pragma once

#include "libvelmora/signal/importing/csvtable.h"

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>

namespace velmora {

// The columns of the CSV form that phone apps exchange; the first eight stand in this order where no row names them.
namespace CsvColumn {
enum Id : std::size_t
{
    Name,
    ShortName,
    Request,
    Equation,
    Min,
    Max,
    Unit,
    Header,
    StartDiagnostic,
    StopDiagnostic,
    Scale,
    RefreshDelay,
};
} // namespace CsvColumn

inline constexpr std::size_t CsvColumnCount = CsvColumn::RefreshDelay + 1;

// By a heading's name, whatever its case and blanks; nothing for any other.
std::optional<std::size_t> csvColumn(std::string name);

// Whether a row names the columns.
bool isCsvHeading(CsvRecord const& record);
// Whether it begins with ~ or #.
bool isCsvComment(CsvRecord const& record);

std::string trimmedCell(std::string const& text);

// Digits in capitals, without 0x and blanks; nothing if the cell is not hexadecimal.
std::optional<std::string> requestCell(std::string const& cell);

// Nothing if the cell is no finite number as a whole.
std::optional<double> numberCell(std::string const& cell);

// A spreadsheet in a country of decimal commas writes another form, in which A*0,5 can't be told from two cells.
bool isSemicolonTable(std::string_view text);

} // namespace velmora
