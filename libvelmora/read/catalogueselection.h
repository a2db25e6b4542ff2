#pragma once

#include <obd/dtcdatamodel.h>
#include <velmora/catalogue.h>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

using CatalogueRows = std::vector<std::shared_ptr<obd::DtcDataModel>>;

// The rows of one maker.
CatalogueRows selectMaker(CatalogueRows const& rows, std::string const& maker);

// The rows whose text or code has, for each of the words, a word that begins with it; in any order, in any case. A
// phrase counts as its words.
CatalogueRows selectWords(CatalogueRows const& rows, std::vector<std::string> const& words);

} // namespace velmora
