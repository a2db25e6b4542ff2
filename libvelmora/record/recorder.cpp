#include "libvelmora/record/recorderparts.h"
#include "libvelmora/record/vinmask.h"

#include <velmora/recorder.h>

#include <algorithm>

namespace velmora {

namespace {

// A header of a recording is one line of plain text.
std::string headerText(std::string text)
{
    std::replace_if(
        text.begin(), text.end(), [](char each) { return each >= 0 && each < ' '; }, ' ');
    return text.empty() ? "unknown" : text;
}

} // namespace

Recorder::Recorder(std::string const& file) : m_parts(std::make_unique<RecorderParts>(file)) {}

Recorder::~Recorder() = default;

std::size_t Recorder::save(std::string const& vehicle, bool keepVin)
{
    obdsim::Dialogue dialogue = m_parts->dialogue();
    if (dialogue.exchanges.empty()) {
        return 0;
    }
    dialogue.vehicle = headerText(vehicle);
    dialogue.adapter = headerText(dialogue.adapter);
    if (!keepVin) {
        maskVins(dialogue);
    }
    m_parts->file.save(dialogue);
    return dialogue.exchanges.size();
}

} // namespace velmora
