#pragma once

#include "simulator/dialogue.h"

#include <filesystem>
#include <fstream>

namespace velmora {

// A file that a recorded dialogue is to be written to. Replaces no file; one that nothing was saved to is removed.
class DialogueFile
{
public:
    // Throws Error if the file exists already or can't be written.
    explicit DialogueFile(std::filesystem::path path);
    ~DialogueFile();
    DialogueFile(DialogueFile const&) = delete;
    DialogueFile& operator=(DialogueFile const&) = delete;

    // Throws Error if it can't be written whole.
    void save(obdsim::Dialogue const& dialogue);

private:
    std::filesystem::path const m_path;
    std::ofstream m_out;
    bool m_saved = false;
};

} // namespace velmora
