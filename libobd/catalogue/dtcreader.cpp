#include "libobd/catalogue/dtcreader.h"

#include <common/tracestream.h>

#include <mutex>
#include <string_view>
#include <utility>

namespace obd {
namespace {

constexpr char const* reserved = "ISO/SAE Reserved";
constexpr char const* unknownCode = "Unknown Trouble Code";
constexpr char const* unknownMaker = "Unknown";

std::string genericName()
{
    return Manufacturer::manufacturerToString(Manufacturer::Generic);
}

} // namespace

std::shared_mutex DtcReader::m_mutex;
std::multimap<Manufacturer::AutoManufacturer, std::shared_ptr<DtcDataModel>, DtcReader::comparer> DtcReader::m_data;

bool DtcReader::init()
{
    return load(DtcTable::size(), &DtcTable::row);
}

bool DtcReader::load(std::size_t count, RowSource const& row)
{
    std::unique_lock const lock(m_mutex);
    for (std::size_t i = 0; i < count; ++i) {
        DtcRow const next = row(i);
        auto const maker = static_cast<Manufacturer::AutoManufacturer>(next.maker);
        std::string code = next.code;
        std::string systemName = system(code);
        // The hint costs nothing with makers in rising order, and never breaks the order of the rows of one maker.
        m_data.emplace_hint(m_data.end(), maker,
                            std::make_shared<DtcDataModel>(std::move(code), next.text, std::move(systemName),
                                                           Manufacturer::manufacturerToString(maker)));
    }
    return count > 0;
}

void DtcReader::clean()
{
    std::unique_lock const lock(m_mutex);
    m_data.clear();
}

std::shared_ptr<DtcDataModel> DtcReader::getGenericCode(std::string const& code) const
{
    std::shared_lock const lock(m_mutex);
    auto const [first, last] = m_data.equal_range(Manufacturer::Generic);
    for (auto entry = first; entry != last; ++entry) {
        DtcDataModel const& model = *entry->second;
        if (model.code == code) {
            return std::make_shared<DtcDataModel>(code, model.description, system(code), model.manufacturer);
        }
    }
    return std::make_shared<DtcDataModel>(code, reserved, system(code), genericName());
}

std::vector<std::shared_ptr<DtcDataModel>> DtcReader::getTroubleCodes(std::string const& code) const
{
    std::shared_lock const lock(m_mutex);
    std::vector<std::shared_ptr<DtcDataModel>> meanings;
    for (auto const& entry : m_data) {
        if (entry.second->code == code) {
            meanings.push_back(entry.second);
        }
    }
    if (meanings.empty()) {
        tervex::TraceStream << "Failed to find DTC -> build default";
        meanings.push_back(defaultModel(code));
    }
    return meanings;
}

std::vector<std::shared_ptr<DtcDataModel>> DtcReader::getTroubleCodes() const
{
    std::shared_lock const lock(m_mutex);
    std::map<std::string, std::shared_ptr<DtcDataModel>> firsts;
    for (auto const& entry : m_data) {
        firsts.emplace(entry.second->code, entry.second);
    }
    std::vector<std::shared_ptr<DtcDataModel>> models;
    models.reserve(firsts.size());
    for (auto const& first : firsts) {
        models.push_back(first.second);
    }
    return models;
}

std::vector<std::shared_ptr<DtcDataModel>> DtcReader::getRows() const
{
    std::shared_lock const lock(m_mutex);
    std::vector<std::shared_ptr<DtcDataModel>> rows;
    rows.reserve(m_data.size());
    for (auto const& entry : m_data) {
        rows.push_back(entry.second);
    }
    return rows;
}

std::string DtcReader::getSystem(std::string const& code) const
{
    return system(code);
}

std::string DtcReader::system(std::string const& code)
{
    switch (code.empty() ? '\0' : code.front()) {
    case 'P':
        return "Powertrain";
    case 'B':
        return "Body";
    case 'C':
        return "Chassis";
    case 'U':
        return "Network";
    default:
        return "Undefined";
    }
}

std::shared_ptr<DtcDataModel> DtcReader::defaultModel(std::string const& code)
{
    std::string maker = getDefaultManufacturer(code);
    char const* const description = maker == genericName() ? reserved : unknownCode;
    return std::make_shared<DtcDataModel>(code, description, system(code), std::move(maker));
}

// SAE J2012 leaves some ranges of codes to the makers.
std::string DtcReader::getDefaultManufacturer(std::string const& code)
{
    struct MakersRange
    {
        char letter;
        std::string_view digits;
    };
    static constexpr MakersRange makersRanges[] = {{'P', "13"}, {'B', "12"}, {'C', "12"}, {'U', "123"}};
    char const letter = code.at(0);
    char const digit = code.at(1);
    for (MakersRange const& range : makersRanges) {
        if (range.letter == letter && range.digits.find(digit) != std::string_view::npos) {
            return unknownMaker;
        }
    }
    return genericName();
}

} // namespace obd
