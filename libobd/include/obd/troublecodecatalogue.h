#pragma once

#include <obd/dtcdatamodel.h>
#include <obd/export.h>

#include <memory>
#include <string>
#include <vector>

/// The texts of trouble codes without a vehicle. Filled from LIBOBDOpen to LIBOBDClose; outside of that every code gets
/// its default text. Any thread. The models are shared: read only.
namespace obd::TroubleCodeCatalogue {

/// Whether a text is a trouble code that a vehicle can report (SAE J2012): P, B, C or U, a digit from 0 to 3, and three
/// hexadecimal digits, all in upper case. It need not stand in the catalogue.
OBD_EXPORT bool isTroubleCode(std::string const& text);

/// All meanings of a code: the generic one first, then those of makers. A code that is not known gives one model that
/// says so, of the maker "Generic" or "Unknown". Empty for what is no trouble code.
OBD_EXPORT std::vector<std::shared_ptr<DtcDataModel>> getTroubleCodes(std::string const& code);

/// Every row, the generic ones first, then maker by maker, for searching and listing.
OBD_EXPORT std::vector<std::shared_ptr<DtcDataModel>> getRows();

} // namespace obd::TroubleCodeCatalogue
