#include "simulator/adapter/profile.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

constexpr char const* elmDescription = "OBDII to RS232 Interpreter";

// clang-format off
AdapterProfile const profiles[] = {
    {"elm327-v1.5", AdapterFamily::Elm, "ELM327 v1.5", elmDescription, "", 142, "", {Quirk::PaddingCut}},
    {"elm327-v1.2", AdapterFamily::Elm, "ELM327 v1.2", elmDescription, "", 120, "", {}},
    {"elm327-v1.3a", AdapterFamily::Elm, "ELM327 v1.3a", elmDescription, "", 131, "", {}},
    {"elm327-v1.4", AdapterFamily::Elm, "ELM327 v1.4", elmDescription, "", 140, "", {}},
    {"elm327-v2.1", AdapterFamily::Elm, "ELM327 v2.1", elmDescription, "", 142, "", {Quirk::PaddingCut}},
    {"elm327-v2.2", AdapterFamily::Elm, "ELM327 v2.2", elmDescription, "", 220, "", {}},
    {"elm327-v2.3", AdapterFamily::Elm, "ELM327 v2.3", elmDescription, "", 230, "", {}},
    {"stn2120", AdapterFamily::Stn, "ELM327 v2.3", elmDescription, "", 230, "STN2120 v5.8.1", {}},
    {"obdlink", AdapterFamily::Stn, "ELM327 v1.3a", elmDescription, "", 230, "STN1110 v4.2.0", {}},
    {"clone-v1.5-fake", AdapterFamily::Elm, "ELM327 v1.5", elmDescription, "", 142, "",
        {Quirk::OkToAll, Quirk::JunkBeforeBanner, Quirk::PaddingCut}},
    {"clone-v2.1-poor", AdapterFamily::Elm, "ELM327 v2.1", elmDescription, "", 120, "",
        {Quirk::FirstLettersOnly, Quirk::HeadersStuck, Quirk::NoCountDigit, Quirk::PaddingCut, Quirk::RequestCut}},
    {"obdkey", AdapterFamily::ObdKey, "OBDKey 1.30", "OBDKey Bluetooth", "KB-0130", 142, "", {Quirk::PaddingCut}},
    {"diamex", AdapterFamily::Diamex, "DIAMEX DXM v1.2", "DIAMEX DXM Module", "DX-20071", 142, "", {Quirk::PaddingCut}},
    {"kiwi", AdapterFamily::Kiwi, "PLXKiwi v1.4", "PLX Kiwi WiFi", "PLX-4711", 142, "", {Quirk::PaddingCut}},
    {"obdpros", AdapterFamily::ObdPros, "OBDPros v3.1", "OBDPros Scantool", "OP-3100", 120, "", {Quirk::PaddingCut}},
    {"unknown", AdapterFamily::Other, "CarWave Adapter 7", "CarWave Diagnostics", "CW-0007", 142, "", {Quirk::PaddingCut}},
    {"silent", AdapterFamily::Silent, "", "", "", 0, "", {}},
};
// clang-format on

struct FamilyWord
{
    char const* word;
    char const* key;
};

constexpr FamilyWord familyWords[] = {
    {"ELM", "elm327-v1.5"}, {"OBDKEY", "obdkey"}, {"DIAMEX", "diamex"}, {"PLXKIWI", "kiwi"}, {"OBDPRO", "obdpros"},
};

std::string upperCase(std::string text)
{
    for (auto& character : text) {
        if (character >= 'a' && character <= 'z') {
            character = static_cast<char>(character - 0x20);
        }
    }
    return text;
}

AdapterProfile const& familyProfile(std::string const& banner)
{
    std::string const text = upperCase(banner);
    for (auto const& row : familyWords) {
        if (text.find(row.word) != std::string::npos) {
            return *findProfile(row.key);
        }
    }
    return *findProfile("unknown");
}

} // namespace

AdapterProfile const* findProfile(std::string_view key)
{
    auto const found =
        std::find_if(std::begin(profiles), std::end(profiles), [key](AdapterProfile const& p) { return p.key == key; });
    return found == std::end(profiles) ? nullptr : &*found;
}

std::vector<std::string> profileKeys()
{
    std::vector<std::string> keys;
    for (auto const& profile : profiles) {
        keys.push_back(profile.key);
    }
    return keys;
}

AdapterProfile profileForBanner(std::string const& banner)
{
    auto const same = std::find_if(std::begin(profiles), std::end(profiles),
                                   [&](AdapterProfile const& p) { return !banner.empty() && p.banner == banner; });
    if (same != std::end(profiles)) {
        return *same;
    }
    AdapterProfile profile = banner.empty() ? profiles[0] : familyProfile(banner);
    profile.banner = banner.empty() ? profile.banner : banner;
    return profile;
}

} // namespace obdsim
