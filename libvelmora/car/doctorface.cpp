// The examination as applications see it; see <velmora/doctor.h>.

#include "libvelmora/car/onecar.h"
#include "libvelmora/car/sessionend.h"
#include "libvelmora/doctor/doctor.h"
#include "libvelmora/record/checkedfile.h"
#include "libvelmora/record/dialoguerecorder.h"

#include <velmora/doctor.h>
#include <velmora/error.h>

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <fstream>

namespace velmora {

class DoctorParts
{
public:
    explicit DoctorParts(CarOptions const& options)
        : session(SessionOptions(options)), end(session, options), report(examine(session, recorder))
    {}

    OneCar const place;
    DialogueRecorder recorder;
    Session session;
    SessionEnd end;
    DoctorReport report;
};

Doctor::Doctor(CarOptions const& options) : m_parts(std::make_unique<DoctorParts>(options)) {}

Doctor::~Doctor() = default;

bool Doctor::isHealthy() const
{
    return m_parts->report.isHealthy();
}

std::string Doctor::toText() const
{
    return velmora::toText(m_parts->report);
}

std::string Doctor::toJson() const
{
    return printed(velmora::toJson(m_parts->report));
}

std::string Doctor::bundle(bool keepVin) const
{
    return makeBundle(m_parts->report, m_parts->session, m_parts->recorder, keepVin);
}

void Doctor::checkBundle(std::string const& file, bool replace)
{
    std::error_code error;
    if (!replace && std::filesystem::exists(file, error)) {
        throw Error(ErrorKind::WrongUse, "The file " + file + " stands already",
                    {"--force replaces it", "write to another name"});
    }
    requireWritable(file, "bundle");
}

void Doctor::saveBundle(std::string const& file, bool keepVin) const
{
    std::ofstream out(file, std::ios::binary);
    out << bundle(keepVin) << std::flush;
    if (!out) {
        throw Error(ErrorKind::Failed, "Could not write " + file + ": " + std::strerror(errno),
                    {"is there a folder of that name, and room on the disk?"});
    }
}

} // namespace velmora
