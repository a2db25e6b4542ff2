#include "program/view/live/bigdigits.h"

#include <array>
#include <string_view>

namespace velmora::cli {

namespace {

constexpr std::size_t pixelRows = 5;

struct Glyph
{
    char character;
    std::array<std::string_view, pixelRows> rows;
};

constexpr Glyph glyphs[] = {
    {'0', {"###", "# #", "# #", "# #", "###"}}, {'1', {" # ", "## ", " # ", " # ", "###"}},
    {'2', {"###", "  #", "###", "#  ", "###"}}, {'3', {"###", "  #", " ##", "  #", "###"}},
    {'4', {"# #", "# #", "###", "  #", "  #"}}, {'5', {"###", "#  ", "###", "  #", "###"}},
    {'6', {"###", "#  ", "###", "# #", "###"}}, {'7', {"###", "  #", "  #", " # ", " # "}},
    {'8', {"###", "# #", "###", "# #", "###"}}, {'9', {"###", "# #", "###", "  #", "###"}},
    {'.', {" ", " ", " ", " ", "#"}},           {'-', {"   ", "   ", "###", "   ", "   "}},
};

Glyph const* glyphOf(char character)
{
    for (Glyph const& each : glyphs) {
        if (each.character == character) {
            return &each;
        }
    }
    return nullptr;
}

// Two rows of pixels in one of characters.
std::string halfBlocks(std::string const& upper, std::string const& lower)
{
    static constexpr char const* blocks[] = {" ", "▄", "▀", "█"};
    std::string text;
    for (std::size_t i = 0; i < upper.size(); ++i) {
        text += blocks[(upper[i] == '#' ? 2 : 0) + (lower[i] == '#' ? 1 : 0)];
    }
    return text;
}

} // namespace

std::size_t bigWidth(std::string const& text)
{
    std::size_t width = 0;
    for (char const each : text) {
        Glyph const* const glyph = glyphOf(each);
        width += glyph == nullptr ? 0 : glyph->rows.front().size() + 1;
    }
    return width == 0 ? 0 : width - 1;
}

std::vector<std::string> bigText(std::string const& text, bool ascii)
{
    std::vector<std::string> pixels(pixelRows);
    for (char const each : text) {
        Glyph const* const glyph = glyphOf(each);
        if (glyph == nullptr) {
            return {};
        }
        for (std::size_t row = 0; row < pixelRows; ++row) {
            pixels[row] += (pixels[row].empty() ? "" : " ") + std::string(glyph->rows[row]);
        }
    }
    if (ascii || text.empty()) {
        return text.empty() ? std::vector<std::string>() : pixels;
    }
    std::string const none(pixels.front().size(), ' ');
    return {halfBlocks(pixels[0], pixels[1]), halfBlocks(pixels[2], pixels[3]), halfBlocks(pixels[4], none)};
}

} // namespace velmora::cli
