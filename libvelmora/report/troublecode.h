#pragma once

#include <obd/dtcdatamodel.h>
#include <velmora/troublecode.h>

#include <nlohmann/json_fwd.hpp>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

// Whether the standard leaves the meaning of a code to each maker (SAE J2012).
bool isMakersCode(std::string const& code);

// The meaning that holds for the vehicle: a maker's own only if the maker is known. Null if there is none.
TroubleCode::Meaning const* meaningOf(TroubleCode const& code);

// Its text, or that the code is maker-specific and how many meanings it has.
std::string meaningText(TroubleCode const& code);

// Brings the meanings of each code together, each once, with the codes in the order of their first appearance.
std::vector<TroubleCode> groupByCode(std::vector<std::shared_ptr<obd::DtcDataModel>> const& models);

nlohmann::ordered_json toJsonValue(TroubleCode const& code);
nlohmann::ordered_json toJsonValue(std::vector<TroubleCode> const& codes);

} // namespace velmora
