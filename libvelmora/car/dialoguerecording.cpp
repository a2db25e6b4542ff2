// A dialogue as a recording; see <velmora/recording.h>.

#include "libvelmora/car/onecar.h"
#include "libvelmora/car/sessionend.h"
#include "libvelmora/replay/readdialogue.h"

#include <velmora/recording.h>

namespace velmora {

namespace {

// The session of a car that is replayed, on its caller's thread.
struct ReplayedCar
{
    explicit ReplayedCar(CarOptions const& options) : session(SessionOptions(options)), end(session, options) {}

    OneCar const place;
    Session session;
    SessionEnd end;
};

} // namespace

std::optional<Recording> readDialogueRecording(std::string const& file, CarOptions const& options)
{
    CarOptions replayed = options;
    replayed.port = "replay:" + file + "?instant";
    return readDialogue(file, [&replayed] {
        auto const car = std::make_shared<ReplayedCar>(replayed);
        return std::shared_ptr<Session>(car, &car->session);
    });
}

} // namespace velmora
