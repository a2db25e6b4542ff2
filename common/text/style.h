#pragma once

#include <cstddef>
#include <string>

namespace velmora {

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
    explicit Style(bool coloured, bool detailed = false, std::size_t columns = 0)
        : m_coloured(coloured), m_detailed(detailed), m_columns(columns)
    {}

    bool isColoured() const { return m_coloured; }
    // Whether to show what few ask for, too.
    bool isDetailed() const { return m_detailed; }
    // How wide a line may be; 0 where that does not matter.
    std::size_t columns() const { return m_columns; }
    // The text between the sequences that switch its colour on and off; alone without colours.
    std::string paint(Mark mark, std::string const& text) const;

private:
    bool m_coloured = false;
    bool m_detailed = false;
    std::size_t m_columns = 0;
};

} // namespace velmora
