#pragma once

namespace velmora {

// Wakes a thread that waits for a descriptor.
class Doorbell
{
public:
    // Throws Error where the system gives no descriptor.
    Doorbell();
    ~Doorbell();
    Doorbell(Doorbell const&) = delete;
    Doorbell& operator=(Doorbell const&) = delete;

    // To be waited for beside others; readable from a ring on until it is hushed.
    int descriptor() const { return m_descriptor; }
    void ring() const;
    void hush() const;

private:
    int const m_descriptor;
};

} // namespace velmora
