#pragma once

#include <filesystem>

namespace support {

inline std::filesystem::path const dialogueFolder = std::filesystem::path(VELMORA_SOURCE_DIR) / "tests" / "dialogues";

} // namespace support
