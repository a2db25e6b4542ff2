#include "libvelmora/signal/signalfile.h"

#include "libvelmora/signal/signalreferences.h"
#include "libvelmora/signal/signaltable.h"
#include "libvelmora/text/toml.h"

#include <velmora/error.h>

#include <filesystem>
#include <fstream>
#include <set>
#include <sstream>

namespace velmora {

namespace {

// What the table of the whole file may hold.
class FileReader
{
public:
    explicit FileReader(std::string const& path) { m_reading.file.path = path; }

    SignalFileReading read(toml::table const& document)
    {
        for (auto const& [key, node] : document) {
            if (key == "vehicle") {
                readVehicle(node);
            } else if (key == "signal") {
                readList(node);
            } else {
                mistake(node, std::string(key.str()), "is no key of a signal file (vehicle, signal)");
            }
        }
        if (document.get("signal") == nullptr) {
            m_reading.mistakes.push_back({1, {}, "there is no [[signal]] in it"});
        }
        checkNames();
        return std::move(m_reading);
    }

private:
    void mistake(toml::node const& node, std::string const& key, std::string const& what)
    {
        m_reading.mistakes.push_back({node.source().begin.line, key, what});
    }

    void readVehicle(toml::node const& node)
    {
        toml::table const* const table = node.as_table();
        if (table == nullptr) {
            return mistake(node, "vehicle", "must be a table: [vehicle]");
        }
        for (auto const& [key, value] : *table) {
            if (key == "maker" && value.is_string()) {
                m_reading.file.maker = value.value_or(std::string());
            } else if (key == "vin" && value.is_string()) {
                m_reading.file.vin = value.value_or(std::string());
            } else if (key == "models" && value.is_array() &&
                       value.as_array()->is_homogeneous(toml::node_type::string)) {
                for (toml::node const& word : *value.as_array()) {
                    m_reading.file.models.push_back(word.value_or(std::string()));
                }
            } else {
                mistake(value, "vehicle, " + std::string(key.str()),
                        "only maker and vin (texts) and models (a list of texts) are known here");
            }
        }
    }

    void readList(toml::node const& node)
    {
        toml::array const* const list = node.as_array();
        if (list == nullptr || !list->is_homogeneous(toml::node_type::table)) {
            return mistake(node, "signal", "must be a list of tables: [[signal]]");
        }
        std::size_t number = 0;
        for (toml::node const& entry : *list) {
            ++number;
            std::vector<SignalMistake> found;
            Signal signal = readSignal(*entry.as_table(), "signal " + std::to_string(number), found);
            if (!signal.id.empty() && !m_ids.insert(signal.id).second) {
                found.push_back({entry.source().begin.line, "signal " + std::to_string(number) + ", id",
                                 "\"" + signal.id + "\" is used twice"});
            }
            if (found.empty()) {
                m_lines.push_back(entry.source().begin.line);
                m_reading.file.signals.push_back(std::move(signal));
            }
            m_reading.mistakes.insert(m_reading.mistakes.end(), found.begin(), found.end());
        }
    }

    // A formula may read other signals of its file, by their ids, in no circle.
    void checkNames()
    {
        for (std::size_t const index : brokenReferences(m_reading.file.signals)) {
            m_reading.mistakes.push_back({m_lines[index], m_reading.file.signals[index].id + ", formula",
                                          "it reads a signal that is not in this file, or itself in a circle"});
        }
    }

    SignalFileReading m_reading;
    std::vector<std::size_t> m_lines; // of the signals that are kept
    std::set<std::string> m_ids;
};

} // namespace

SignalFileReading readSignals(std::string_view text, std::string const& path)
{
    try {
        return FileReader(path).read(toml::parse(text));
    } catch (toml::parse_error const& error) {
        SignalFileReading reading;
        reading.file.path = path;
        reading.mistakes.push_back({error.source().begin.line, {}, std::string(error.description())});
        return reading;
    }
}

std::string readSignalText(std::string const& path)
{
    std::error_code error;
    auto const status = std::filesystem::status(path, error);
    if (error || !std::filesystem::is_regular_file(status)) {
        throw Error(ErrorKind::WrongUse, path + " is no file that can be read",
                    {"a signal file is a text in TOML; `velmora signals import` makes one of a phone app's CSV"});
    }
    if (std::filesystem::file_size(path) > largestSignalFile) {
        throw Error(ErrorKind::WrongUse, path + " is larger than 16 MiB, which no signal file is");
    }
    std::ifstream input(path, std::ios::binary);
    std::ostringstream text;
    text << input.rdbuf();
    if (!input) {
        throw Error(ErrorKind::WrongUse, "Could not read " + path, {"may you read it?"});
    }
    return text.str();
}

SignalFileReading checkSignalFile(std::string const& path)
{
    return readSignals(readSignalText(path), path);
}

SignalFile loadSignalFile(std::string const& path)
{
    SignalFileReading reading = checkSignalFile(path);
    if (reading.mistakes.empty()) {
        return std::move(reading.file);
    }
    std::vector<std::string> lines;
    for (SignalMistake const& each : reading.mistakes) {
        lines.push_back(toText(each, path));
    }
    throw Error(ErrorKind::WrongUse, "The signal file " + path + " has mistakes", std::move(lines));
}

} // namespace velmora
