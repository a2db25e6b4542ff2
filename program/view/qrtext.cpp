#include "program/view/qrtext.h"

#include "program/terminal/terminal.h"

#include <qrcodegen/qrcodegen.hpp>

#include <cstdlib>
#include <unistd.h>

namespace velmora::cli {

namespace {

constexpr int quiet = 4;

} // namespace

std::string qrText(std::string const& text)
{
    auto const code = qrcodegen::QrCode::encodeText(text.c_str(), qrcodegen::QrCode::Ecc::LOW);
    static constexpr char const* blocks[] = {" ", "▄", "▀", "█"};
    int const end = code.getSize() + quiet;
    std::string result;
    for (int y = -quiet; y < end; y += 2) {
        result += "\033[38;5;16;48;5;231m";
        for (int x = -quiet; x < end; ++x) {
            result += blocks[(code.getModule(x, y) ? 2 : 0) + (code.getModule(x, y + 1) ? 1 : 0)];
        }
        result += "\033[0m\n";
    }
    return result;
}

std::string qrForTerminal(std::string const& text, int terminal)
{
    char const* const noColor = std::getenv("NO_COLOR");
    bool const plain = noColor != nullptr && *noColor != '\0';
    if (plain || ::isatty(terminal) == 0 || !Terminal::speaksUtf8()) {
        return {};
    }
    auto const code = qrcodegen::QrCode::encodeText(text.c_str(), qrcodegen::QrCode::Ecc::LOW);
    auto const needed = static_cast<std::size_t>(code.getSize() + 2 * quiet);
    return Terminal::columnsOf(terminal) >= needed ? qrText(text) : std::string();
}

} // namespace velmora::cli
