// The signal files of the face.
#include "libvelmora/report/json.h"
#include "libvelmora/signal/importing/signalimport.h"
#include "libvelmora/signal/signalfile.h"

#include <utility>

namespace velmora {

namespace {

SignalListing listingOf(SignalFile const& file)
{
    SignalListing listing;
    listing.path = file.path;
    for (Signal const& each : file.signals) {
        listing.signals.push_back(
            {each.id, each.name, each.header, each.request, each.unit, each.enabled, each.reason});
    }
    listing.toml = toToml(file);
    listing.json = printed(toJsonValue(file));
    return listing;
}

} // namespace

SignalListing listSignals(std::string const& path)
{
    return listingOf(loadSignalFile(path));
}

SignalListing checkSignals(std::string const& path)
{
    SignalFileReading reading = checkSignalFile(path);
    SignalListing listing = listingOf(reading.file);
    listing.mistakes = std::move(reading.mistakes);
    return listing;
}

SignalListing convertSignals(std::string const& path)
{
    SignalImport import = importSignalFile(path);
    SignalListing listing = listingOf(import.file);
    listing.mistakes = std::move(import.refused);
    listing.notes = std::move(import.notes);
    return listing;
}

} // namespace velmora
