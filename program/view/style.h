#pragma once

#include "program/globaloptions.h"

#include <string>

namespace velmora::cli {

// What a text means to its reader, for its colour.
enum class Mark
{
    None,
    Good,
    Warning,
    Bad,
    Faint, // of no interest
};

// How texts for people are marked: with colours, or not at all.
class Style
{
public:
    Style() = default; // without colours
    explicit Style(bool coloured, bool detailed = false) : m_coloured(coloured), m_detailed(detailed) {}

    bool isColoured() const { return m_coloured; }
    // Whether to show what few ask for, too.
    bool isDetailed() const { return m_detailed; }
    // The text between the sequences that switch its colour on and off; alone without colours.
    std::string paint(Mark mark, std::string const& text) const;

private:
    bool m_coloured = false;
    bool m_detailed = false;
};

// Whether to use colours. What the user chose for this run comes before noColor, the wish for none in all programs;
// left alone, a terminal gets colours.
bool wantsColor(std::optional<ColorMode> mode, bool noColor, bool terminal);

// The style of standard output.
Style outputStyle(GlobalOptions const& options);

} // namespace velmora::cli
