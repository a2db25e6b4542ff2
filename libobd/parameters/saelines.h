#pragma once

#include <cstddef>
#include <vector>

namespace obd {

// A multi-line reply of service 06 or 09 on the legacy buses: lines of service, identifier, sequence number and 4
// data bytes, and on ISO 9141-2 and J1850 a checksum, which the parser leaves there. Holds a reference: the reply must
// outlive it. Positions past the end of the reply throw std::out_of_range.
class SaeLines
{
public:
    static constexpr std::size_t lineLength = 7; // without checksum
    static constexpr std::size_t dataLength = 4;

    SaeLines(std::vector<unsigned char> const& data, std::size_t checksumLength)
        : m_data(data), m_step(lineLength + checksumLength)
    {}

    // The number of whole lines.
    std::size_t count() const { return m_data.size() / m_step; }

    bool beginsWith(std::size_t line, std::vector<unsigned char> const& signature) const;

    // The line's place by its sequence number, which counts from 1; 4294967295 where that is 0.
    unsigned int place(std::size_t line) const;

    // Byte `index` of the line, from its service byte on.
    unsigned char byte(std::size_t line, std::size_t index) const { return m_data.at(line * m_step + index); }

    // A big-endian field of the line.
    unsigned int word(std::size_t line, std::size_t index) const;

    // Bytes of the line from `index` on.
    std::vector<unsigned char> bytes(std::size_t line, std::size_t index, std::size_t count) const;

    // The 4 data bytes.
    std::vector<unsigned char> data(std::size_t line) const { return bytes(line, 3, dataLength); }

    // Writes the 4 data bytes to a place of an item, counted in lines.
    void copyData(std::size_t line, std::vector<unsigned char>& item, std::size_t toPlace) const;

private:
    std::vector<unsigned char> const& m_data;
    std::size_t m_step;
};

// Puts the lines from `first` on in the order of their sequence numbers into `item`, whose size tells how many they
// are. False with a log line if a number does not belong to the item.
bool assembleItem(SaeLines const& lines, std::size_t first, std::vector<unsigned char>& item);

} // namespace obd
