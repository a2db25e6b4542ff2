#pragma once

#include <obd/dtcdatamodel.h>

#include <nlohmann/json_fwd.hpp>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

// One trouble code as people read it: all its meanings together.
struct TroubleCode
{
    struct Meaning
    {
        std::string maker;
        std::string text;

        bool operator==(Meaning const&) const = default;
    };

    std::string code;
    std::string system;
    std::vector<Meaning> meanings;
};

// Brings the meanings of each code together, each once, with the codes in the order of their first appearance.
std::vector<TroubleCode> groupByCode(std::vector<std::shared_ptr<obd::DtcDataModel>> const& models);

nlohmann::ordered_json toJsonValue(TroubleCode const& code);
nlohmann::ordered_json toJsonValue(std::vector<TroubleCode> const& codes);

} // namespace velmora
