#include "program/command/commandcar.h"

#include "program/terminal/interrupt.h"
#include "program/terminal/output.h"
#include "program/terminal/promptreader.h"
#include "program/view/printtext.h"

#include <utility>

namespace velmora::cli {

namespace {

// A line that is drawn over.
void drawPhase(std::string const& phase)
{
    tell("\r\033[K" + phase);
}

CarOptions recordedOptions(GlobalOptions const& options, std::stop_token stop, std::shared_ptr<Recorder> recorder)
{
    CarOptions result = carOptions(options, std::move(stop));
    result.recorder = std::move(recorder);
    return result;
}

} // namespace

InterruptStop::InterruptStop()
{
    Interrupt::instance().setHandler([this] { m_source.request_stop(); });
}

InterruptStop::~InterruptStop()
{
    Interrupt::instance().setHandler(nullptr);
}

CarOptions carOptions(GlobalOptions const& options, std::stop_token stop)
{
    CarOptions result = options;
    result.stop = std::move(stop);
    if (!options.quiet) {
        result.onProgress = tellText;
        if (PromptReader::canRedraw()) {
            result.onPhase = drawPhase;
        }
    }
    if (options.verbose) {
        result.onDetail = tellText;
    }
    result.onUnwritten = [trace = options.traceFile](std::string const& file) {
        tellLateFailure("Could not write all of the " + std::string(file == trace ? "trace" : "log") + " file " + file +
                        "; is the disk full?");
    };
    return result;
}

CommandCar::CommandCar(GlobalOptions const& options, std::shared_ptr<Recorder> recorder)
    : Car(recordedOptions(options, token(), std::move(recorder))), m_options(options)
{}

Error silentVehicle(Car& car, std::string const& what, std::vector<std::string> hints)
{
    std::string const trouble = car.trouble();
    if (trouble.empty()) {
        return {ErrorKind::VehicleSilent, what, std::move(hints)};
    }
    hints.emplace_back("does the wiring hold, and is nothing else plugged into the car's bus?");
    return {ErrorKind::VehicleSilent, what + "; the adapter reports " + trouble, std::move(hints)};
}

} // namespace velmora::cli
