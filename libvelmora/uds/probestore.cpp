#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/identifierprobe.h"
#include "libvelmora/uds/refusalcode.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include <fstream>

namespace velmora {

namespace {

using Document = nlohmann::ordered_json;

template <typename Value>
Value memberOr(nlohmann::json const& object, char const* key, Value const& other)
{
    auto const found = object.find(key);
    if constexpr (std::is_same_v<Value, std::string>) {
        return found != object.end() && found->is_string() ? found->get<std::string>() : other;
    } else {
        return found != object.end() && found->is_number_unsigned() ? found->get<Value>() : other;
    }
}

Document dataList(std::map<unsigned int, std::vector<unsigned char>> const& data)
{
    Document list = Document::object();
    for (auto const& [id, bytes] : data) {
        list[fmt::format("{:04X}", id)] = hexText(bytes);
    }
    return list;
}

Document refusalList(std::map<unsigned int, unsigned char> const& codes)
{
    Document list = Document::object();
    for (auto const& [id, code] : codes) {
        list[fmt::format("{:04X}", id)] = hexText({code});
    }
    return list;
}

// What is no such list is none.
std::map<unsigned int, std::vector<unsigned char>> readList(nlohmann::json const& document, char const* key)
{
    std::map<unsigned int, std::vector<unsigned char>> list;
    auto const found = document.find(key);
    if (found == document.end() || !found->is_object()) {
        return list;
    }
    for (auto const& [id, value] : found->items()) {
        auto const number = hexBytes(id);
        auto const bytes = value.is_string() ? hexBytes(value.get<std::string>()) : std::nullopt;
        if (number && number->size() == 2 && bytes) {
            list[static_cast<unsigned int>((*number)[0]) << 8U | (*number)[1]] = *bytes;
        }
    }
    return list;
}

std::map<unsigned int, unsigned char> readRefusals(nlohmann::json const& document, char const* key)
{
    std::map<unsigned int, unsigned char> codes;
    for (auto const& [id, bytes] : readList(document, key)) {
        if (bytes.size() == 1) {
            codes[id] = bytes.front();
        }
    }
    return codes;
}

Document documentOf(ProbeState const& state)
{
    ProbeTask const& task = state.task;
    return {{"module", task.header},
            {"reply", task.reply},
            {"ext", task.extended ? hexText({*task.extended}) : std::string()},
            {"service", task.service},
            {"from", task.from},
            {"to", task.to},
            {"vin", state.vin},
            {"next", state.next},
            {"told", dataList(state.told)},
            {"locked", refusalList(state.locked)},
            {"later", refusalList(state.later)},
            {"second", dataList(state.second)}};
}

} // namespace

std::optional<ProbeState> ProbeStore::load() const
{
    std::error_code ignored;
    if (!std::filesystem::is_regular_file(m_file, ignored)) {
        return std::nullopt;
    }
    std::ifstream in(m_file);
    nlohmann::json const document = nlohmann::json::parse(in, nullptr, false);
    if (!document.is_object() || !document.contains("next")) {
        return std::nullopt;
    }
    ProbeState state;
    state.task.header = memberOr<std::string>(document, "module", "");
    state.task.reply = memberOr<std::string>(document, "reply", "");
    if (auto const ext = hexBytes(memberOr<std::string>(document, "ext", "")); ext && ext->size() == 1) {
        state.task.extended = ext->front();
    }
    state.task.service = static_cast<unsigned char>(memberOr<unsigned int>(document, "service", 0) & 0xFFU);
    state.task.from = memberOr<unsigned int>(document, "from", 0);
    state.task.to = memberOr<unsigned int>(document, "to", 0);
    state.vin = memberOr<std::string>(document, "vin", "");
    state.next = memberOr<unsigned int>(document, "next", 0);
    state.told = readList(document, "told");
    state.locked = readRefusals(document, "locked");
    state.later = readRefusals(document, "later");
    state.second = readList(document, "second");
    return state;
}

void ProbeStore::save(ProbeState const& state) const
{
    std::error_code failed;
    std::filesystem::create_directories(m_file.parent_path(), failed);
    std::filesystem::path const temporary = m_file.string() + ".new";
    std::ofstream out(temporary);
    out << documentOf(state).dump(2) << '\n';
    out.close();
    if (out) {
        std::filesystem::rename(temporary, m_file, failed);
    }
    if (!out || failed) {
        throw Error(ErrorKind::Failed, "The probe can't be kept: " + m_file.string() + " can't be written",
                    {"is the disk full?"});
    }
}

void ProbeStore::drop() const
{
    std::error_code ignored;
    std::filesystem::remove(m_file, ignored);
}

std::filesystem::path ProbeStore::besides(std::filesystem::path const& settings, ProbeTask const& task)
{
    return settings.parent_path() / fmt::format("probe-{}{}-{:02X}.json", task.header,
                                                task.extended ? "-" + hexText({*task.extended}) : std::string(),
                                                static_cast<unsigned int>(task.service));
}

nlohmann::ordered_json toJsonValue(ProbeState const& state)
{
    Document told = Document::array();
    for (auto const& [id, data] : state.told) {
        auto const second = state.second.find(id);
        told.push_back({{"id", probeIdText(state.task, id)},
                        {"data", hexText(data)},
                        {"text", identifierText(id, data)},
                        {"changes", second != state.second.end() && second->second != data}});
    }
    auto const refused = [&](std::map<unsigned int, unsigned char> const& codes) {
        Document list = Document::array();
        for (auto const& [id, code] : codes) {
            list.push_back(
                {{"id", probeIdText(state.task, id)}, {"code", hexText({code})}, {"reason", refusalName(code)}});
        }
        return list;
    };
    return {{"module", state.task.header},
            {"service", hexText({state.task.service})},
            {"from", probeIdText(state.task, state.task.from)},
            {"to", probeIdText(state.task, state.task.to)},
            {"told", told},
            {"locked", refused(state.locked)},
            {"later", refused(state.later)}};
}

} // namespace velmora
