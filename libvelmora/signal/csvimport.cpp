#include "libvelmora/signal/csvtable.h"
#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/importedrow.h"
#include "libvelmora/signal/lookuptable.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/signal/standardpid.h"

#include <velmora/error.h>

#include <algorithm>
#include <array>
#include <cctype>
#include <charconv>

namespace velmora {

namespace {

enum Column : std::size_t
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
    ColumnCount,
};

// By their names without blanks, in lower case.
std::optional<std::size_t> columnOf(std::string name)
{
    static constexpr std::pair<std::string_view, Column> names[] = {
        {"name", Name},
        {"shortname", ShortName},
        {"modeandpid", Request},
        {"equation", Equation},
        {"minvalue", Min},
        {"maxvalue", Max},
        {"units", Unit},
        {"header", Header},
        {"obdheader", Header},
        {"startdiagnostic", StartDiagnostic},
        {"stopdiagnostic", StopDiagnostic},
        {"scale", Scale},
        {"minimumrefreshdelaymillis", RefreshDelay},
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

std::string trimmed(std::string const& text)
{
    constexpr char const* blanks = " \t";
    std::size_t const first = text.find_first_not_of(blanks);
    return first == std::string::npos ? "" : text.substr(first, text.find_last_not_of(blanks) - first + 1);
}

bool isHeading(CsvRecord const& record)
{
    return record.cells.size() >= 3 && columnOf(trimmed(record.cells[0])) == Name &&
           std::any_of(record.cells.begin(), record.cells.end(),
                       [](std::string const& cell) { return columnOf(trimmed(cell)) == Request; });
}

bool isComment(CsvRecord const& record)
{
    std::string const first = trimmed(record.cells.front());
    return first.starts_with('~') || first.starts_with('#');
}

// Without 0x and blanks, in capitals; nothing if it is not hexadecimal.
std::optional<std::string> requestDigits(std::string const& cell)
{
    std::string text = trimmed(cell);
    if (text.starts_with("0x") || text.starts_with("0X")) {
        text = text.substr(2);
    }
    return hexDigits(text);
}

std::optional<double> numberIn(std::string const& cell)
{
    double number = 0.0;
    auto const [end, error] = std::from_chars(cell.data(), cell.data() + cell.size(), number);
    return error == std::errc() && end == cell.data() + cell.size() ? std::optional(number) : std::nullopt;
}

class CsvImporter
{
public:
    explicit CsvImporter(std::string const& path) : m_collector(path)
    {
        for (std::size_t i = 0; i < Header + 1; ++i) {
            m_order.push_back(static_cast<Column>(i));
        }
    }

    SignalImport import(std::vector<CsvRecord> const& records)
    {
        for (CsvRecord const& record : records) {
            if (isComment(record)) {
                continue;
            }
            if (isHeading(record)) {
                readHeading(record);
            } else {
                readRow(record);
            }
        }
        return m_collector.finish();
    }

    void noteEncoding() { m_collector.note(1, {}, "is no UTF-8; it was read as ISO 8859-1"); }

private:
    using Cells = std::array<std::string, ColumnCount>;

    void readHeading(CsvRecord const& record)
    {
        m_order.clear();
        for (std::string const& cell : record.cells) {
            auto const column = columnOf(trimmed(cell));
            if (!column && !trimmed(cell).empty()) {
                m_collector.note(record.line, "column " + trimmed(cell), "is not known and was left out");
            }
            m_order.push_back(column);
        }
    }

    void readRow(CsvRecord const& record)
    {
        Cells cells;
        for (std::size_t i = 0; i < std::min(m_order.size(), record.cells.size()); ++i) {
            if (m_order[i]) {
                cells[*m_order[i]] = trimmed(record.cells[i]);
            }
        }
        if (std::all_of(cells.begin(), cells.end(), [](std::string const& cell) { return cell.empty(); })) {
            return;
        }
        m_line = record.line;
        m_name = cells[Name];
        if (auto signal = read(cells)) {
            m_collector.add(m_line, std::move(*signal));
        }
    }

    std::nullopt_t refuse(std::string const& why)
    {
        m_collector.refuse(m_line, m_name.empty() ? "a row without a name" : m_name, why);
        return std::nullopt;
    }

    std::optional<Signal> read(Cells const& cells)
    {
        if (m_name.empty()) {
            return refuse("it has no name");
        }
        Signal signal;
        signal.name = m_name;
        if (!readRequest(signal, cells[Request]) || !readEquation(signal, cells)) {
            return std::nullopt;
        }
        if (!fillAddresses(signal, cells[Header])) {
            return refuse("header \"" + cells[Header] + "\" is none whose reply could be told");
        }
        readRange(signal, cells);
        signal.unit = knownUnit(cells[Unit]);
        if (!cells[StartDiagnostic].empty()) {
            signal.enabled = false;
            signal.reason = "needs session " + cells[StartDiagnostic] + ", which is not opened";
        }
        if (auto const delay = numberIn(cells[RefreshDelay]); delay && *delay > 0.0) {
            signal.rate = 1000.0 / *delay;
        }
        if (!signal.reason.empty()) {
            m_collector.note(m_line, m_name, signal.reason);
        }
        signal.id = m_collector.newId(m_name);
        return signal;
    }

    bool readRequest(Signal& signal, std::string const& cell)
    {
        auto digits = requestDigits(cell);
        if (!digits) {
            refuse("request \"" + cell + "\" is not hexadecimal");
            return false;
        }
        if (digits->size() % 2 != 0) {
            digits->pop_back(); // the adapter's count of expected frames
        }
        signal.request = *hexBytes(*digits);
        if (signal.request.empty()) {
            return true;
        }
        if (auto const refusal = refusalOf(signal.request)) {
            refuse(*refusal);
            return false;
        }
        return true;
    }

    bool readEquation(Signal& signal, Cells const& cells)
    {
        try {
            readLookup(signal, cells[Equation]);
            if (signal.request.empty() && bytesReadBy(*signal.formula) > 0) {
                refuse("it reads bytes, but has no request");
                return false;
            }
            return readOthers(signal, cells[Equation]) && scale(signal, cells[Scale]);
        } catch (FormulaError const& error) {
            refuse("equation \"" + cells[Equation] + "\": " + error.what() + " (at character " +
                   std::to_string(error.position() + 1) + ")");
            return false;
        }
    }

    void readLookup(Signal& signal, std::string const& equation)
    {
        if (auto const table = parseLookup(equation)) {
            signal.formula = parseFormula(table->formula, FormulaDialect::Phone);
            signal.values = table->texts;
            signal.precision = 0;
        } else {
            signal.formula = parseFormula(equation, FormulaDialect::Phone);
        }
    }

    // Values of standard PIDs in an equation, [0D], become signals of their own.
    bool readOthers(Signal const& signal, std::string const& equation)
    {
        for (std::string const& name : valuesReadBy(*signal.formula)) {
            auto const bytes = name.starts_with("[") ? hexBytes(name.substr(1, 2)) : std::nullopt;
            if (!bytes || m_collector.knows(name)) {
                continue;
            }
            std::optional<Signal> other = standardPidSignal(bytes->front());
            if (!other) {
                refuse("equation \"" + equation + "\": the value of PID " + name + " is not known here");
                return false;
            }
            other->id = m_collector.newId("PID_" + hexText(*bytes));
            m_collector.call(name, other->id);
            m_collector.note(m_line, m_name, "reads the standard PID " + name + ", which comes in as " + other->id);
            m_collector.add(m_line, std::move(*other));
        }
        return true;
    }

    bool scale(Signal& signal, std::string const& cell)
    {
        if (cell.empty() || cell == "1") {
            return true;
        }
        auto const factor = numberIn(cell);
        if (!factor) {
            refuse("scale \"" + cell + "\" is no number");
            return false;
        }
        signal.formula = FormulaNode{
            FormulaStep::Multiply, 0.0, {}, {std::move(*signal.formula), {FormulaStep::Number, *factor, {}, {}}}};
        return true;
    }

    // Such files often have them swapped, or the same number twice.
    void readRange(Signal& signal, Cells const& cells)
    {
        auto const min = numberIn(cells[Min]);
        auto const max = numberIn(cells[Max]);
        if (!min || !max || *min == *max) {
            return;
        }
        signal.min = std::min(*min, *max);
        signal.max = std::max(*min, *max);
        if (*min > *max) {
            m_collector.note(m_line, m_name, "minimum and maximum were swapped");
        }
    }

    ImportCollector m_collector;
    std::vector<std::optional<std::size_t>> m_order;
    std::size_t m_line = 0;
    std::string m_name;
};

// A spreadsheet in a country of decimal commas writes another form, in which A*0,5 can't be told from two cells.
bool looksLikeSemicolons(std::string_view text)
{
    std::string_view const first = text.substr(0, text.find('\n'));
    return std::count(first.begin(), first.end(), ';') >= 3 && std::count(first.begin(), first.end(), ',') < 3;
}

} // namespace

SignalImport importSignalCsv(std::string_view text, std::string const& path)
{
    if (text.starts_with("\xEF\xBB\xBF")) {
        text.remove_prefix(3);
    }
    if (looksLikeSemicolons(text)) {
        throw Error(ErrorKind::WrongUse, path + " is separated by semicolons, as spreadsheets write it",
                    {"save it separated by commas and with decimal points"});
    }
    bool const utf8 = isUtf8(text);
    std::vector<CsvRecord> const records = readCsv(utf8 ? std::string(text) : fromLatin1(text));
    CsvImporter importer(path);
    if (!utf8) {
        importer.noteEncoding();
    }
    SignalImport import = importer.import(records);
    if (import.file.signals.empty() && import.refused.empty()) {
        throw Error(
            ErrorKind::WrongUse, path + " holds no signals",
            {"wanted are the columns Name, ShortName, ModeAndPID, Equation, Min Value, Max Value, Units, Header"});
    }
    return import;
}

} // namespace velmora
