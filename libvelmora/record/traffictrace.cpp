#include "libvelmora/record/traffictrace.h"

#include "libvelmora/record/checkedfile.h"

#include <common/outputfile.h>

#include <fmt/chrono.h>

#include <chrono>
#include <ctime>

namespace velmora {

namespace {

// Line ends and bytes that no terminal shows stand as escapes, so that an entry is one line.
std::string escaped(std::vector<unsigned char> const& data)
{
    std::string text;
    for (unsigned char const byte : data) {
        if (byte == '\r') {
            text += "\\r";
        } else if (byte == '\n') {
            text += "\\n";
        } else if (byte == '\\') {
            text += "\\\\";
        } else if (byte < 0x20 || byte > 0x7E) {
            text += fmt::format("\\x{:02X}", byte);
        } else {
            text += static_cast<char>(byte);
        }
    }
    return text;
}

} // namespace

TrafficTrace::TrafficTrace(std::filesystem::path const& file) : m_out(nullptr, &tervex::closeWritten)
{
    requireWritable(file, "trace file");
    m_out.reset(tervex::openForWriting(file));
    m_failed = m_out == nullptr;
}

void TrafficTrace::onDataSent(std::vector<unsigned char> const& data)
{
    write(">>", data);
}

void TrafficTrace::onDataReceived(std::vector<unsigned char> const& data)
{
    write("<<", data);
}

void TrafficTrace::write(std::string_view arrow, std::vector<unsigned char> const& data)
{
    auto const now = std::chrono::system_clock::now();
    auto const ms = std::chrono::duration_cast<std::chrono::milliseconds>(now.time_since_epoch()).count() % 1000;
    std::lock_guard const lock(m_mutex);
    if (m_out == nullptr) {
        return;
    }
    std::string const line =
        fmt::format("{:%H:%M:%S}.{:03d} {} {}\n", fmt::localtime(std::chrono::system_clock::to_time_t(now)), ms, arrow,
                    escaped(data));
    bool const written = std::fputs(line.c_str(), m_out.get()) >= 0;
    if (std::fflush(m_out.get()) != 0 || !written) {
        m_failed = true;
    }
}

} // namespace velmora
