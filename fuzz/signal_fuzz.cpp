// Signal files, formulas and imports, by the first byte of the input. What was accepted must survive being written and
// read again.

#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/importing/signalimport.h"
#include "libvelmora/signal/signalfile.h"

#include <velmora/error.h>

#include <cstdlib>
#include <string>

namespace {

using namespace velmora;

void formula(std::string const& text, FormulaDialect dialect)
{
    try {
        FormulaNode const tree = parseFormula(text, dialect);
        std::vector<unsigned char> const bytes(text.begin(), text.end());
        evaluate(tree, {bytes, [](std::string const&) { return std::optional(1.5); }});
        std::string const written = toText(tree);
        if (written.size() <= longestFormula && toText(parseFormula(written)) != written) {
            std::abort();
        }
    } catch (FormulaError const&) {
        // Refusing is right.
    }
}

void file(std::string const& text)
{
    SignalFileReading const reading = readSignals(text, "input");
    std::string const written = toToml(reading.file);
    if (!reading.file.signals.empty() && reading.mistakes.empty()) {
        SignalFileReading const again = readSignals(written, "input");
        if (!again.mistakes.empty() || toToml(again.file) != written) {
            std::abort();
        }
    }
}

void import(std::string const& text)
{
    try {
        toToml(importSignals(text, "input").file);
    } catch (Error const&) {
        // Refusing is right.
    }
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(unsigned char const* data, std::size_t size)
{
    if (size == 0) {
        return 0;
    }
    std::string const text(data + 1, data + size);
    switch (data[0] % 4) {
    case 0:
        formula(text, FormulaDialect::Own);
        break;
    case 1:
        formula(text, FormulaDialect::Phone);
        break;
    case 2:
        file(text);
        break;
    default:
        import(text);
    }
    return 0;
}
