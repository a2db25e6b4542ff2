#include "libvelmora/uds/modulestore.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <nlohmann/json.hpp>

#include <fstream>

namespace velmora {

namespace {

std::string textIn(nlohmann::json const& object, char const* key)
{
    auto const found = object.find(key);
    return found != object.end() && found->is_string() ? found->get<std::string>() : std::string();
}

nlohmann::ordered_json toldOrNull(std::string const& text)
{
    return text.empty() ? nlohmann::ordered_json(nullptr) : nlohmann::ordered_json(text);
}

} // namespace

nlohmann::ordered_json toJsonValue(FoundModule const& module)
{
    nlohmann::ordered_json json = {
        {"request", module.request},
        {"reply", module.reply},
        {"name", toldOrNull(module.name)},
        {"part", toldOrNull(module.part)},
        {"software", toldOrNull(module.software)},
        {"codes", module.codes ? nlohmann::ordered_json(*module.codes) : nlohmann::ordered_json(nullptr)}};
    for (auto const& [did, text] : module.identifiers) {
        json["identifiers"][fmt::format("{:04X}", did)] = text;
    }
    return json;
}

nlohmann::json ModuleStore::read() const
{
    std::error_code ignored;
    if (!std::filesystem::is_regular_file(m_file, ignored)) {
        return nlohmann::json::object();
    }
    std::ifstream in(m_file);
    nlohmann::json document = nlohmann::json::parse(in, nullptr, false);
    return document.is_object() ? document : nlohmann::json::object();
}

std::optional<std::vector<FoundModule>> ModuleStore::find(std::string const& vin) const
{
    nlohmann::json const document = read();
    auto const vehicle = document.find(vin);
    if (vin.empty() || vehicle == document.end() || !vehicle->is_array()) {
        return std::nullopt;
    }
    std::vector<FoundModule> modules;
    for (nlohmann::json const& each : *vehicle) {
        if (!each.is_object() || textIn(each, "request").empty() || textIn(each, "reply").empty()) {
            continue;
        }
        FoundModule module{textIn(each, "request"), textIn(each, "reply"),    textIn(each, "name"),
                           textIn(each, "part"),    textIn(each, "software"), {}};
        if (auto const codes = each.find("codes"); codes != each.end() && codes->is_number_unsigned()) {
            module.codes = codes->get<unsigned int>();
        }
        modules.push_back(std::move(module));
    }
    return modules;
}

void ModuleStore::keep(std::string const& vin, std::vector<FoundModule> const& modules) const
{
    nlohmann::json document = read();
    document[vin] = nlohmann::json::array();
    for (FoundModule const& each : modules) {
        document[vin].push_back(nlohmann::json(toJsonValue(each)));
    }
    std::error_code failed;
    std::filesystem::create_directories(m_file.parent_path(), failed);
    std::filesystem::path const temporary = m_file.string() + ".new";
    std::ofstream out(temporary);
    out << document.dump(2, ' ', false, nlohmann::json::error_handler_t::replace) << '\n';
    out.close();
    if (out) {
        std::filesystem::rename(temporary, m_file, failed);
    }
    if (!out || failed) {
        throw Error(ErrorKind::Failed, "The modules can't be remembered: " + m_file.string() + " can't be written",
                    {"is the disk full?"});
    }
}

std::filesystem::path ModuleStore::besides(std::filesystem::path const& settings)
{
    return settings.parent_path() / "modules.json";
}

} // namespace velmora
