#pragma once

#include <obd/dtcdatamodel.h>

#include <memory>
#include <string>
#include <vector>

namespace velmora {

using CatalogueRows = std::vector<std::shared_ptr<obd::DtcDataModel>>;

// The makers of the catalogue, as it writes them.
std::vector<std::string> catalogueMakers();

// The maker's name as the catalogue writes it, from one in any case and without its blanks or hyphens. Throws Error
// with the list of makers if there is none.
std::string findMaker(std::string const& name);

// The rows of one maker.
CatalogueRows selectMaker(CatalogueRows const& rows, std::string const& maker);

// The rows whose text or code has, for each of the words, a word that begins with it; in any order, in any case. A
// phrase counts as its words.
CatalogueRows selectWords(CatalogueRows const& rows, std::vector<std::string> const& words);

} // namespace velmora
