#include "libvelmora/channel/returnnote.h"

#include <charconv>
#include <fstream>
#include <map>
#include <mutex>
#include <sstream>
#include <utility>

namespace velmora {

namespace {

using NotesByPort = std::map<std::string, ReturnNote>;

std::mutex notesMutex;

// Protected by notesMutex; by file.
std::map<std::string, NotesByPort>& notesOfProcess()
{
    static std::map<std::string, NotesByPort> notes;
    return notes;
}

// A line is a port, the number of a bus and the commands, with tabs between them. What is no such line is passed over.
NotesByPort readNotes(std::filesystem::path const& file)
{
    NotesByPort notes;
    std::ifstream in(file);
    for (std::string line; std::getline(in, line);) {
        std::istringstream cells(line);
        std::string port;
        std::string number;
        ReturnNote note;
        std::getline(cells, port, '\t');
        std::getline(cells, number, '\t');
        std::from_chars(number.data(), number.data() + number.size(), note.protocol);
        for (std::string command; std::getline(cells, command, '\t');) {
            if (command.starts_with("AT")) {
                note.commands.push_back(command);
            }
        }
        if (!port.empty() && !note.commands.empty()) {
            notes[port] = note;
        }
    }
    return notes;
}

void writeNotes(std::filesystem::path const& file, NotesByPort const& notes)
{
    std::error_code ignored;
    if (notes.empty()) {
        std::filesystem::remove(file, ignored);
        return;
    }
    std::filesystem::create_directories(file.parent_path(), ignored);
    std::ofstream out(file, std::ios::trunc);
    for (auto const& [port, note] : notes) {
        out << port << '\t' << note.protocol;
        for (std::string const& command : note.commands) {
            out << '\t' << command;
        }
        out << '\n';
    }
}

// Reads the file the first time. With notesMutex held.
NotesByPort& notesOf(std::filesystem::path const& file)
{
    auto const [found, isNew] = notesOfProcess().try_emplace(file.string());
    if (isNew && !file.empty()) {
        found->second = readNotes(file);
    }
    return found->second;
}

} // namespace

std::optional<ReturnNote> ReturnNotes::find(std::string const& port) const
{
    std::lock_guard const lock(notesMutex);
    NotesByPort const& notes = notesOf(m_file);
    auto const found = notes.find(port);
    return found != notes.end() ? std::optional(found->second) : std::nullopt;
}

void ReturnNotes::put(std::string const& port, ReturnNote const& note) const
{
    std::lock_guard const lock(notesMutex);
    NotesByPort& notes = notesOf(m_file);
    notes[port] = note;
    if (!m_file.empty()) {
        writeNotes(m_file, notes);
    }
}

void ReturnNotes::strike(std::string const& port) const
{
    std::lock_guard const lock(notesMutex);
    NotesByPort& notes = notesOf(m_file);
    if (notes.erase(port) != 0 && !m_file.empty()) {
        writeNotes(m_file, notes);
    }
}

std::filesystem::path ReturnNotes::besides(std::filesystem::path const& settings)
{
    return settings.parent_path() / "adapters.txt";
}

} // namespace velmora
