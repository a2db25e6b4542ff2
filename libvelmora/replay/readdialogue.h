#pragma once

#include "libvelmora/replay/recording.h"
#include "libvelmora/session/session.h"

#include <filesystem>
#include <functional>
#include <memory>
#include <optional>

namespace velmora {

// The live values that a dialogue holds, each at the time that its reply was whole. Dialogues keep the time that
// replies took and no other, so it counts from the first command and leaves out what the host waited. Nothing where no
// two readings lie apart: such a dialogue can only be read as a vehicle. open: makes a session with the port
// replay:FILE?instant that is not connected yet. Throws Error.
std::optional<Recording> readDialogue(std::filesystem::path const& file,
                                      std::function<std::shared_ptr<Session>()> const& open);

} // namespace velmora
