#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

namespace obd {

// The places of a long ISO 15765-2 message's consecutive frames. Frames tell their number modulo 16 only, and may come
// out of order. All inline, since each frame of a reply comes by here. One thread.
class CanSlots
{
public:
    // As many places as a first frame announces. Those that are taken stay so.
    void expect(std::uint32_t frames)
    {
        m_filled.resize(frames);
        m_futileTries.fill(0);
        // Numbers repeat every 16 frames. The rounds are counted by 15, since number 0 spends its first try before slot
        // 0.
        m_rounds = (frames + numbers - 2) / (numbers - 1);
    }

    // The first free place whose number is right, which is taken. If none is free it is the last one tried. Arithmetic
    // is modulo 2^32 on purpose: number 0 stands before place 0 and must not look like a low one.
    std::uint32_t claim(unsigned char number)
    {
        std::uint32_t const first = number - 1U;
        for (unsigned char& tries = m_futileTries[number]; tries < m_rounds; ++tries) {
            std::uint32_t const slot = first + numbers * tries;
            if (slot < m_filled.size() && !m_filled[slot]) {
                m_filled[slot] = true;
                return slot;
            }
        }
        return first + numbers * (std::max(m_rounds, 1U) - 1);
    }

private:
    static constexpr std::uint32_t numbers = 16;

    std::vector<bool> m_filled; // one for each consecutive frame expected
    std::uint32_t m_rounds = 1; // how often a number may be tried against the places
    // By number: how many tries in a row are known to find no free place, since nothing frees one but a new first
    // frame. Without it each frame of a long message would try all rounds before its own.
    std::array<unsigned char, numbers> m_futileTries{};
};

} // namespace obd
