#include "simulator/serve/tracepeer.h"

#include "simulator/bytes.h"
#include "simulator/error.h"
#include "simulator/textfile.h"

#include <cerrno>
#include <cstring>

namespace obdsim {

namespace {

std::string escaped(std::string_view bytes)
{
    std::string text;
    for (char const each : bytes) {
        if (each == '\r') {
            text += "\\r";
        } else if (each == '\n') {
            text += "\\n";
        } else if (each == '\\') {
            text += "\\\\";
        } else if (each >= ' ' && each <= '~') {
            text += each;
        } else {
            text += "\\x" + hexByte(static_cast<std::uint8_t>(each));
        }
    }
    return text;
}

} // namespace

TraceFile::TraceFile(std::string const& path) : m_path(path), m_file(openForWriting(path))
{
    if (m_file == nullptr) {
        throw SimulatorError(path + ": the trace cannot be written: " + std::strerror(errno));
    }
    std::setvbuf(m_file, nullptr, _IOLBF, BUFSIZ);
}

TraceFile::~TraceFile()
{
    std::fclose(m_file);
}

void TraceFile::write(Time time, std::size_t car, char direction, std::string_view bytes)
{
    double const seconds = std::chrono::duration<double>(time).count();
    bool const written = std::fprintf(m_file, "%.6f %zu %c %s\n", seconds, car, direction, escaped(bytes).c_str()) >= 0;
    if (!written && !m_told) {
        m_told = true;
        std::fprintf(stderr, "%s: the trace cannot be written: %s\n", m_path.c_str(), std::strerror(errno));
    }
}

TracePeer::TracePeer(std::shared_ptr<IPeer> inner, std::shared_ptr<TraceFile> file, std::size_t car)
    : m_inner(std::move(inner)), m_file(std::move(file)), m_car(car)
{}

void TracePeer::receive(std::string_view bytes)
{
    m_file->write(now(), m_car, '>', bytes);
    m_inner->receive(bytes);
}

std::optional<Time> TracePeer::nextOutput() const
{
    return m_inner->nextOutput();
}

std::optional<Time> TracePeer::nextWake() const
{
    return m_inner->nextWake();
}

std::string TracePeer::advanceTo(Time time)
{
    std::string said = m_inner->advanceTo(time);
    if (!said.empty()) {
        m_file->write(now(), m_car, '<', said);
    }
    return said;
}

Time TracePeer::now() const
{
    return m_inner->now();
}

void TracePeer::connect()
{
    m_inner->connect();
}

bool TracePeer::linkIsUp() const
{
    return m_inner->linkIsUp();
}

} // namespace obdsim
