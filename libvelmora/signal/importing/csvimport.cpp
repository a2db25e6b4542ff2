#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/importing/csvcolumns.h"
#include "libvelmora/signal/importing/csvtable.h"
#include "libvelmora/signal/importing/importedrow.h"
#include "libvelmora/signal/lookuptable.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/signal/standardpid.h"

#include <velmora/error.h>

#include <algorithm>
#include <array>

namespace velmora {

namespace {

class CsvImporter
{
public:
    explicit CsvImporter(std::string const& path) : m_collector(path)
    {
        for (std::size_t i = 0; i <= CsvColumn::Header; ++i) {
            m_order.push_back(i);
        }
    }

    SignalImport import(std::vector<CsvRecord> const& records)
    {
        for (CsvRecord const& record : records) {
            if (isCsvComment(record)) {
                continue;
            }
            if (isCsvHeading(record)) {
                readHeading(record);
            } else {
                readRow(record);
            }
        }
        return m_collector.finish();
    }

    void noteEncoding() { m_collector.note(1, {}, "is no UTF-8; it was read as ISO 8859-1"); }

private:
    using Cells = std::array<std::string, CsvColumnCount>;

    void readHeading(CsvRecord const& record)
    {
        m_order.clear();
        for (std::string const& cell : record.cells) {
            auto const column = csvColumn(trimmedCell(cell));
            if (!column && !trimmedCell(cell).empty()) {
                m_collector.note(record.line, "column " + trimmedCell(cell), "is not known and was left out");
            }
            m_order.push_back(column);
        }
    }

    void readRow(CsvRecord const& record)
    {
        Cells cells;
        for (std::size_t i = 0; i < std::min(m_order.size(), record.cells.size()); ++i) {
            if (m_order[i]) {
                cells[*m_order[i]] = trimmedCell(record.cells[i]);
            }
        }
        if (std::all_of(cells.begin(), cells.end(), [](std::string const& cell) { return cell.empty(); })) {
            return;
        }
        m_line = record.line;
        m_name = cells[CsvColumn::Name];
        if (auto signal = read(cells)) {
            m_collector.addNamed(m_line, std::move(*signal));
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
        if (!readRequest(signal, cells[CsvColumn::Request]) || !readEquation(signal, cells)) {
            return std::nullopt;
        }
        if (!fillAddresses(signal, cells[CsvColumn::Header])) {
            return refuse("header \"" + cells[CsvColumn::Header] + "\" is none whose reply could be told");
        }
        readRange(signal, cells);
        signal.unit = knownUnit(cells[CsvColumn::Unit]);
        if (!cells[CsvColumn::StartDiagnostic].empty()) {
            requireSession(signal, "session " + cells[CsvColumn::StartDiagnostic]);
        }
        if (auto const delay = numberCell(cells[CsvColumn::RefreshDelay]); delay && *delay > 0.0) {
            signal.rate = 1000.0 / *delay;
        }
        return signal;
    }

    bool readRequest(Signal& signal, std::string const& cell)
    {
        auto digits = requestCell(cell);
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
            readLookup(signal, cells[CsvColumn::Equation]);
            if (signal.request.empty() && bytesReadBy(*signal.formula) > 0) {
                refuse("it reads bytes, but has no request");
                return false;
            }
            return readOthers(signal, cells[CsvColumn::Equation]) && scale(signal, cells[CsvColumn::Scale]);
        } catch (FormulaError const& error) {
            refuse("equation \"" + cells[CsvColumn::Equation] + "\": " + error.what() + " (at character " +
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
        auto const factor = numberCell(cell);
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
        auto const min = numberCell(cells[CsvColumn::Min]);
        auto const max = numberCell(cells[CsvColumn::Max]);
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

} // namespace

SignalImport importSignalCsv(std::string_view text, std::string const& path)
{
    if (text.starts_with("\xEF\xBB\xBF")) {
        text.remove_prefix(3);
    }
    if (isSemicolonTable(text)) {
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
