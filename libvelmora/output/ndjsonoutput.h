#pragma once

#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/linefile.h"

namespace velmora {

// One JSON object a line and a reading; events, trips and trouble codes are objects of their own with "event".
class NdjsonOutput : public IOutput
{
public:
    explicit NdjsonOutput(OutputAddress const& address) : m_file(address) {}

    void open() override { m_file.setHeader(""); }
    void write(Records records) override;
    void close() override { m_file.close(); }

private:
    LineFile m_file;
};

} // namespace velmora
