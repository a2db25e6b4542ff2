#include "libvelmora/record/dialoguefile.h"

#include "libvelmora/record/checkedfile.h"

#include <velmora/error.h>

#include <utility>

namespace velmora {

namespace {

std::filesystem::path const& unused(std::filesystem::path const& path)
{
    requirePlainFile(path);
    if (std::error_code error; std::filesystem::exists(path, error)) {
        throw Error(ErrorKind::WrongUse, "The file " + path.string() + " exists already",
                    {"record to another name, or remove the file first"});
    }
    return path;
}

} // namespace

DialogueFile::DialogueFile(std::filesystem::path path) : m_path(std::move(path)), m_out(unused(m_path))
{
    if (!m_out) {
        throw Error(ErrorKind::Failed, "Could not write the recording " + m_path.string(),
                    {"does its folder exist, and may you write there?"});
    }
}

DialogueFile::~DialogueFile()
{
    if (!m_saved) {
        m_out.close();
        std::error_code ignored;
        std::filesystem::remove(m_path, ignored);
    }
}

void DialogueFile::save(obdsim::Dialogue const& dialogue)
{
    m_out << obdsim::formatDialogue(dialogue);
    m_out.close();
    m_saved = true;
    if (!m_out) {
        throw Error(ErrorKind::Failed, "Could not write the recording " + m_path.string(),
                    {"is the disk full? what is there is cut off"});
    }
}

} // namespace velmora
