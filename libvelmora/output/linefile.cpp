#include "libvelmora/output/linefile.h"

#include "libvelmora/output/valuetext.h"

#include <velmora/error.h>

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace velmora {

namespace {

constexpr int mostFiles = 10000; // beside one another

long dayOf(WallTime time)
{
    return std::chrono::floor<std::chrono::days>(time).time_since_epoch().count();
}

std::filesystem::path beside(std::filesystem::path const& file, std::string const& addition)
{
    return file.parent_path() / (file.stem().string() + "-" + addition + file.extension().string());
}

std::string compactTime(WallTime time)
{
    std::string text = utcTime(time);
    std::erase_if(text, [](char each) { return each == '-' || each == ':'; });
    return text.substr(0, 15) + "Z"; // 20260301T081500Z
}

} // namespace

LineFile::LineFile(OutputAddress const& address) : m_base(address.target)
{
    std::string const rotate = address.option("rotate");
    m_daily = rotate == "day";
    if (!m_daily && !rotate.empty()) {
        m_maxSize = parseSize(rotate);
    }
}

LineFile::~LineFile()
{
    close();
}

void LineFile::close()
{
    if (m_descriptor >= 0) {
        ::close(m_descriptor);
        m_descriptor = -1;
    }
}

void LineFile::fail(std::string const& what) const
{
    std::string const file = m_file.empty() ? m_base.string() : m_file.string();
    throw Error(ErrorKind::Failed, "Could not " + what + " " + file + ": " + std::strerror(errno),
                {"does the folder exist, may you write there, and is there room on the disk?"});
}

void LineFile::setHeader(std::string const& header)
{
    if (m_descriptor < 0 || header != m_header) {
        close();
        m_header = header;
        open();
    }
}

void LineFile::open()
{
    if (m_base == "-") {
        m_file = m_base;
        m_descriptor = ::fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 0);
        m_isRegular = false;
        write(m_header);
        return;
    }
    for (int number = 1; number < mostFiles; ++number) {
        if (openIfFits(number == 1 ? m_base : beside(m_base, std::to_string(number)))) {
            return;
        }
    }
    errno = EEXIST;
    fail("find a free name beside");
}

// A line that a crash left unfinished at the end is cut off.
bool LineFile::openIfFits(std::filesystem::path const& file)
{
    m_file = file;
    m_descriptor = ::open(file.c_str(), O_RDWR | O_CREAT | O_CLOEXEC | O_APPEND, 0600);
    struct stat facts = {};
    if (m_descriptor < 0 || ::fstat(m_descriptor, &facts) != 0) {
        fail("open");
    }
    m_isRegular = S_ISREG(facts.st_mode);
    m_size = m_isRegular ? static_cast<unsigned long long>(facts.st_size) : 0;
    m_day = m_size == 0 ? 0 : dayOf(WallTime(std::chrono::seconds(facts.st_mtime)));
    if (m_size == 0) {
        write(m_header);
        return true;
    }
    std::string begin(m_header.size(), '\0');
    char last = '\0';
    while (m_size > 0 && ::pread(m_descriptor, &last, 1, static_cast<off_t>(m_size - 1)) == 1 && last != '\n') {
        --m_size;
    }
    bool const same = ::pread(m_descriptor, begin.data(), begin.size(), 0) == static_cast<ssize_t>(begin.size()) &&
                      begin == m_header && m_size >= begin.size();
    if (!same) {
        close();
        return false;
    }
    if (::ftruncate(m_descriptor, static_cast<off_t>(m_size)) != 0) {
        fail("repair");
    }
    return true;
}

void LineFile::rotateIfDue(WallTime now, std::size_t coming)
{
    bool const full = m_maxSize > 0 && m_size > m_header.size() && m_size + coming > m_maxSize;
    bool const nextDay = m_daily && m_day != 0 && dayOf(now) != m_day;
    if (!m_isRegular || !(full || nextDay)) {
        return;
    }
    std::filesystem::path target = beside(m_base, compactTime(now));
    std::error_code unknown; // what it is, renaming tells
    for (int number = 2; std::filesystem::exists(target, unknown); ++number) {
        target = beside(m_base, compactTime(now) + "-" + std::to_string(number));
    }
    // One that somebody has moved away already needs no other name.
    if (::rename(m_file.c_str(), target.c_str()) != 0 && errno != ENOENT) {
        fail("rename");
    }
    close();
    open();
}

void LineFile::add(std::string const& lines, WallTime now)
{
    if (lines.empty()) {
        return;
    }
    if (m_descriptor < 0) {
        open();
    }
    rotateIfDue(now, lines.size());
    write(lines);
    m_day = dayOf(now);
}

void LineFile::write(std::string const& text)
{
    std::size_t done = 0;
    while (done < text.size()) {
        ssize_t const count = ::write(m_descriptor, text.data() + done, text.size() - done);
        if (count < 0 && errno == EINTR) {
            continue;
        }
        if (count <= 0) {
            int const why = errno;
            if (m_isRegular && ::ftruncate(m_descriptor, static_cast<off_t>(m_size)) != 0) {
                close(); // opening it again cuts the unfinished line
            }
            errno = why;
            fail("write to");
        }
        done += static_cast<std::size_t>(count);
    }
    m_size += text.size();
    if (m_isRegular) {
        ::fdatasync(m_descriptor);
    }
}

} // namespace velmora
