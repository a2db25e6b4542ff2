#include "program/view/live/livecsv.h"

#include "common/text/text.h"
#include "program/view/timetext.h"

#include <velmora/error.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace velmora::cli {

namespace {

constexpr std::chrono::seconds longestWait{1};

[[noreturn]] void failOpen(std::string const& file, int why)
{
    if (why == ENXIO) {
        throw Error(ErrorKind::Failed, "Nobody reads " + file + ", which is a pipe",
                    {"start its reader first, or name a file"});
    }
    throw Error(ErrorKind::Failed, "Could not open " + file + " for writing: " + std::strerror(why),
                {why == EISDIR ? "name a file in it" : "does the folder exist, and may you write there?"});
}

std::FILE* openFile(std::string const& file)
{
    // Not truncated yet: a connection that fails must not cost an old recording. A pipe that nobody reads is an error
    // here, for the opening would wait for a reader without end.
    int const descriptor =
        file == "-" ? ::dup(STDOUT_FILENO) : ::open(file.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC | O_NONBLOCK, 0644);
    if (descriptor >= 0 && file != "-") {
        ::fcntl(descriptor, F_SETFL, ::fcntl(descriptor, F_GETFL) & ~O_NONBLOCK);
    }
    std::FILE* const stream = descriptor >= 0 ? ::fdopen(descriptor, "w") : nullptr;
    if (stream == nullptr) {
        failOpen(file, errno);
    }
    return stream;
}

} // namespace

std::string toCsvHeader(std::vector<LiveRow> const& rows)
{
    std::string text = "time";
    for (LiveRow const& row : rows) {
        text += "," + csvField(nameWithUnit(row));
    }
    return text + "\n";
}

std::string toCsvRow(std::vector<LiveRow> const& rows, std::string const& time)
{
    std::string text = time;
    for (LiveRow const& row : rows) {
        text += "," + csvField(orDash(row.value));
    }
    return text + "\n";
}

void LiveCsv::Close::operator()(std::FILE* file) const
{
    std::fclose(file);
}

LiveCsv::LiveCsv(std::string const& file, bool replaced) : m_file(file), m_replaced(replaced), m_stream(openFile(file))
{}

// Whether the file stands with these columns, so that rows may follow.
bool LiveCsv::joins(std::string const& header) const
{
    struct stat info
    {};
    if (toStandardOutput() || ::fstat(::fileno(m_stream.get()), &info) != 0 || !S_ISREG(info.st_mode) ||
        info.st_size == 0) {
        return false;
    }
    std::string begin(header.size(), '\0');
    std::ifstream(m_file).read(begin.data(), static_cast<std::streamsize>(begin.size()));
    if (begin == header) {
        return true;
    }
    throw Error(ErrorKind::WrongUse, "The file " + m_file + " exists already, and has other columns",
                {"--force replaces it", "record to another name, or choose the sensors and units that it has"});
}

void LiveCsv::begin(LiveTable const& table, LiveTime now, WallTime start)
{
    m_begin = now;
    m_start = start;
    m_rowTime = now;
    std::string const header = toCsvHeader(table.rows());
    if (m_replaced && !toStandardOutput()) {
        [[maybe_unused]] int const cut = ::ftruncate(::fileno(m_stream.get()), 0); // a pipe has nothing to cut off
    } else if (joins(header)) {
        goOn();
        return;
    }
    write(header);
}

// Behind the last row, which may have been torn.
void LiveCsv::goOn()
{
    std::ifstream in(m_file);
    in.seekg(-1, std::ios::end);
    std::fseek(m_stream.get(), 0, SEEK_END);
    if (in.get() != '\n') {
        write("\n");
    }
}

bool LiveCsv::update(LiveTable const& table, LiveTime now)
{
    bool const due = table.rounds() != m_rounds || now - m_rowTime >= longestWait;
    bool const written = !due || finish(table, now);
    sync(now);
    return written;
}

bool LiveCsv::finish(LiveTable const& table, LiveTime now)
{
    return table.readings() == m_readings || writeRow(table, now);
}

bool LiveCsv::writeRow(LiveTable const& table, LiveTime now)
{
    m_rounds = table.rounds();
    m_readings = table.readings();
    m_rowTime = now;
    auto const time = m_start + std::chrono::duration_cast<WallTime::duration>(now - m_begin);
    return write(toCsvRow(table.rows(), isoTime(time)));
}

bool LiveCsv::write(std::string const& text)
{
    bool const written = std::fwrite(text.data(), 1, text.size(), m_stream.get()) == text.size();
    if (written && std::fflush(m_stream.get()) == 0) {
        return true;
    }
    if (errno == EPIPE) {
        return false;
    }
    throw Error(ErrorKind::Failed, "Could not write to " + m_file + ": " + std::strerror(errno),
                {"is there room on the disk?"});
}

void LiveCsv::sync(LiveTime now)
{
    if (now - m_syncTime >= longestWait / 2) {
        m_syncTime = now;
        ::fdatasync(::fileno(m_stream.get()));
    }
}

} // namespace velmora::cli
