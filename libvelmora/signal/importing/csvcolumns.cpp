#include "libvelmora/signal/importing/csvcolumns.h"

#include "libvelmora/signal/signalhex.h"

#include <algorithm>
#include <cctype>
#include <charconv>
#include <cmath>
#include <memory>
#include <utility>

namespace velmora {

std::optional<std::size_t> csvColumn(std::string name)
{
    static constexpr std::pair<std::string_view, CsvColumn::Id> names[] = {
        {"name", CsvColumn::Name},
        {"shortname", CsvColumn::ShortName},
        {"modeandpid", CsvColumn::Request},
        {"equation", CsvColumn::Equation},
        {"minvalue", CsvColumn::Min},
        {"maxvalue", CsvColumn::Max},
        {"units", CsvColumn::Unit},
        {"header", CsvColumn::Header},
        {"obdheader", CsvColumn::Header},
        {"startdiagnostic", CsvColumn::StartDiagnostic},
        {"stopdiagnostic", CsvColumn::StopDiagnostic},
        {"scale", CsvColumn::Scale},
        {"minimumrefreshdelaymillis", CsvColumn::RefreshDelay},
    };
    std::erase(name, ' ');
    std::transform(name.begin(), name.end(), name.begin(),
                   [](unsigned char each) { return static_cast<char>(std::tolower(each)); });
    for (auto const& [known, column] : names) {
        if (name == known) {
            return column;
        }
    }
    return std::nullopt;
}

std::string trimmedCell(std::string const& text)
{
    constexpr char const* blanks = " \t";
    std::size_t const first = text.find_first_not_of(blanks);
    return first == std::string::npos ? "" : text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

bool isCsvHeading(CsvRecord const& record)
{
    return record.cells.size() >= 3 && csvColumn(trimmedCell(record.cells[0])) == CsvColumn::Name &&
           std::any_of(record.cells.begin(), record.cells.end(),
                       [](std::string const& cell) { return csvColumn(trimmedCell(cell)) == CsvColumn::Request; });
}

bool isCsvComment(CsvRecord const& record)
{
    std::string const first = trimmedCell(record.cells.front());
    return first.starts_with('~') || first.starts_with('#');
}

std::optional<std::string> requestCell(std::string const& cell)
{
    std::string text = trimmedCell(cell);
    if (text.starts_with("0x") || text.starts_with("0X")) {
        text = text.substr(2);
    }
    return hexDigits(text);
}

std::optional<double> numberCell(std::string const& cell)
{
    double number = 0.0;
    char const* const last = std::to_address(cell.end());
    auto const [end, error] = std::from_chars(cell.data(), last, number);
    bool const whole = error == std::errc() && end == last && std::isfinite(number);
    return whole ? std::optional(number) : std::nullopt;
}

bool isSemicolonTable(std::string_view text)
{
    std::string_view const first = text.substr(0, text.find('\n'));
    return std::count(first.begin(), first.end(), ';') >= 3 && std::count(first.begin(), first.end(), ',') < 3;
}

} // namespace velmora
