#pragma once

#include "libvelmora/signal/formula.h"

#include <velmora/signals.h>

#include <map>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// How the adapter sends flow control to a module whose identifiers are no pair of ISO 15765-4 (ELM327: FC SH, FC SD;
// the mode is always 1, since modules ignore flow control on an identifier of another's).
struct SignalFlowControl
{
    std::string header;              // hexadecimal
    std::vector<unsigned char> data; // 30 00 00 as a rule; with an extended address that comes first
};

// A text that stands in the reply, behind the echo of the request.
struct SignalText
{
    std::size_t first = 0; // byte, A is 0
    std::size_t count = 0; // 0: up to the end
};

// A value that the user's own file tells how to ask for and to decode.
struct Signal
{
    std::string id;                               // capitals, digits and '_'; one of its file
    std::string name;                             // for people
    std::string header;                           // of the request in hexadecimal, empty for a broadcast
    std::string reply;                            // identifier of the answer, where it does not follow from the header
    std::optional<unsigned char> extendedAddress; // of the module (normal extended addressing)
    std::optional<unsigned char> tester;          // the address byte that its replies carry
    std::optional<SignalFlowControl> flowControl;
    std::vector<unsigned char> request; // from the service on; empty for one that is worked out from others
    std::optional<std::size_t> length;  // data bytes of the identifier, where several are asked at once
    std::optional<FormulaNode> formula; // of a number
    std::optional<SignalText> text;     // instead of a formula
    std::map<long, std::string> values; // what a number means
    std::string unit;
    std::optional<double> min; // range of display, never a filter
    std::optional<double> max;
    int precision = 2;
    std::optional<double> rate;      // requests a second that are wanted
    std::optional<unsigned> timeout; // ms that the module may take
    bool enabled = true;
    std::string reason; // why it is switched off, or what was assumed of it
    std::string verifiedBy;
    std::string verifiedOn;
};

// One file of signals.
struct SignalFile
{
    std::string path;
    std::string maker;
    std::vector<std::string> models; // words of the model's name
    std::string vin;                 // pattern: ? is any character, * any text
    std::vector<Signal> signals;
};

// How many bytes of a positive reply repeat the request: the service and its identifier.
std::size_t echoLength(std::vector<unsigned char> const& request);

// Why this request may not be sent for a signal, or nothing. Signals read only, by services 01, 02, 05, 06, 09, 1A, 21
// and 22 of the right length.
std::optional<std::string> refusalOf(std::vector<unsigned char> const& request);

// The identifier of the answer to a request header: as ISO 15765-4 pairs them, 7E0 to 7E7 with 7E8 to 7EF and 18DAxxF1
// with 18DAF1xx. Nothing for any other header.
std::optional<std::string> standardReply(std::string const& header);

// The header of the answer on legacy buses: receiver and sender change places, "82F110" for 8210F1. Nothing for
// a header that is none of a tester there.
std::optional<std::string> swappedReply(std::string const& header);

// Whether a header asks all modules: 7DF, 18DB33F1, and those of the legacy buses.
bool isFunctionalHeader(std::string const& header);

} // namespace velmora
