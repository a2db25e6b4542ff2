#pragma once

#include "libvelmora/output/outputaddress.h"
#include "libvelmora/output/record.h"

#include <filesystem>
#include <string>

namespace velmora {

// A text file that lines are added to, with a header line if it has one. Starts a new file by size or by day (UTC), and
// never mixes lines under different headers. What was added is on the disk when add returns, or not in the file at all.
class LineFile
{
public:
    // The target of the address, "-" for standard output, and its setting rotate: a size, or "day". Throws Error.
    explicit LineFile(OutputAddress const& address);
    ~LineFile();
    LineFile(LineFile const&) = delete;
    LineFile& operator=(LineFile const&) = delete;

    // The header of the lines from now on, with its line end; empty for none. A file that has another one is left as it
    // is, and the lines go to one beside it: drive.csv, drive-2.csv, ...
    void setHeader(std::string const& header);
    // Whole lines. Throws Error if they can't be written; the file is then as it was before.
    void add(std::string const& lines, WallTime now);
    void close();

    std::filesystem::path const& file() const { return m_file; }

private:
    void open();
    bool openIfFits(std::filesystem::path const& file);
    void rotateIfDue(WallTime now, std::size_t coming);
    void write(std::string const& text);
    [[noreturn]] void fail(std::string const& what) const;

    std::filesystem::path const m_base;
    unsigned long long m_maxSize = 0; // 0: not by size
    bool m_daily = false;
    std::string m_header;
    std::filesystem::path m_file; // the one that is open
    int m_descriptor = -1;
    bool m_isRegular = false;
    unsigned long long m_size = 0; // up to here the file is whole
    long m_day = 0;                // of the lines in the file, in days since 1970; 0 without any
};

} // namespace velmora
