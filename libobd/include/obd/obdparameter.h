#pragma once

#include <obd/export.h>
#include <obd/iecu.h>
#include <obd/iquery.h>
#include <obd/responsemap.h>

#include <atomic>
#include <map>
#include <memory>
#include <vector>

namespace obd {

/// A query that sends one OBD request and offers each control module's reply to fromBytes. A concrete parameter says
/// what to send, what a good reply begins with and how to read its bytes. Stored values survive an update that brings
/// none for their module; clear() drops them. Not for two threads at once, save for nack().
class OBD_EXPORT ObdParameter : public IQuery
{
public:
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    unsigned int timeout() const override; ///< 1500 ms
    void clear() override;
    Verdict verdict(IEcu const& ecu) const override;

    /// The request bytes, service first.
    virtual void requestData(std::vector<unsigned char>& data) const;

    /// Takes one module's reply. False for a negative reply, a reply to something else, or data that can't be used.
    virtual bool setResponseData(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data);

    /// The response code of the last update's last negative reply, 0 if there was none; 0x79 for one that was cut
    /// short.
    virtual int nack() const;

protected:
    /// The bytes to send, service first.
    virtual void getRequestData(std::vector<unsigned char>& data) const = 0;

    /// What a reply must begin with. An empty signature matches everything.
    virtual void getSignature(std::vector<unsigned char>& signature) const = 0;

    /// Reads a reply, from its service byte on. False leaves the module's stored value alone.
    virtual bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) = 0;

    /// Notes a negative reply.
    void setNack(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data);

    /// Bytes of checksum behind each 7 byte line of a multi-line reply on ISO 9141-2 and J1850, where the parser leaves
    /// them: 0 or 1, or -1 if the reply has neither form.
    int findSaeChecksumLength(std::vector<unsigned char> const& data) const;

    /// Whether every line of such a reply begins with the signature.
    bool verifySaeSignatures(std::vector<unsigned char> const& data, unsigned int checksumLength) const;

    /// Whether one frame begins with the signature.
    bool verifySaeSignature(std::vector<unsigned char> const& data) const;

private:
    UpdateStatus distribute(std::shared_ptr<IObdProxy> const& proxy, ResponseMap const& responses);
    Verdict judge(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data);

    std::atomic<int> m_nack{0};
    std::map<unsigned int, Verdict> m_verdicts;      ///< of the modules that said something in the last update
    OutcomeKind m_others{OutcomeKind::ModuleSilent}; ///< of all others
};

} // namespace obd
