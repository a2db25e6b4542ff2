#include "libvelmora/signal/importing/csvtable.h"

#include <utility>

namespace velmora {

namespace {

class CsvCutter
{
public:
    explicit CsvCutter(std::string_view text) : m_text(text) {}

    std::vector<CsvRecord> cut()
    {
        for (; m_place < m_text.size(); ++m_place) {
            take(m_text[m_place]);
        }
        if (!m_cell.empty() || !m_record.cells.empty()) {
            endRecord();
        }
        return std::move(m_records);
    }

private:
    void take(char each)
    {
        if (each == '\n') {
            ++m_line;
        }
        if (m_quoted) {
            takeQuoted(each);
        } else if (each == '"' && m_cell.find_first_not_of(' ') == std::string::npos) {
            m_cell.clear();
            m_quoted = true;
        } else if (each == ',') {
            endCell();
        } else if (each == '\n' || each == '\r') {
            endRecord();
        } else {
            m_cell += each;
        }
    }

    void takeQuoted(char each)
    {
        if (each != '"') {
            m_cell += each;
        } else if (m_place + 1 < m_text.size() && m_text[m_place + 1] == '"') {
            m_cell += each;
            ++m_place;
        } else {
            m_quoted = false;
        }
    }

    void endCell() { m_record.cells.push_back(std::exchange(m_cell, {})); }

    void endRecord()
    {
        if (!m_cell.empty() || !m_record.cells.empty()) {
            endCell();
            m_records.push_back(std::exchange(m_record, {}));
        }
        m_record.line = m_line;
    }

    std::string_view m_text;
    std::size_t m_place = 0;
    std::size_t m_line = 1;
    bool m_quoted = false;
    std::string m_cell;
    CsvRecord m_record{1, {}};
    std::vector<CsvRecord> m_records;
};

} // namespace

std::vector<CsvRecord> readCsv(std::string_view text)
{
    return CsvCutter(text).cut();
}

bool isUtf8(std::string_view text)
{
    std::size_t following = 0;
    for (char const each : text) {
        auto const byte = static_cast<unsigned char>(each);
        if (following > 0) {
            if ((byte & 0xC0U) != 0x80) {
                return false;
            }
            --following;
        } else if (byte >= 0xC2 && byte <= 0xDF) {
            following = 1;
        } else if (byte >= 0xE0 && byte <= 0xEF) {
            following = 2;
        } else if (byte >= 0xF0 && byte <= 0xF4) {
            following = 3;
        } else if (byte >= 0x80) {
            return false;
        }
    }
    return following == 0;
}

std::string fromLatin1(std::string_view text)
{
    std::string result;
    for (char const each : text) {
        auto const byte = static_cast<unsigned char>(each);
        if (byte < 0x80) {
            result += each;
        } else {
            result += static_cast<char>(0xC0U | byte >> 6U);
            result += static_cast<char>(0x80U | (byte & 0x3FU));
        }
    }
    return result;
}

} // namespace velmora
