#pragma once

#include <velmora/export.h>

#include <iosfwd>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

/// Whether a control module told of a topic.
enum class TopicAnswer
{
    Read,
    NotOffered, ///< by what the module says it supports, so that it was not asked
    Silent,
    Unreadable, ///< it answered in a form that can't be decoded
    Refused,    ///< by a negative reply
};

/// One trouble code as people read it: all its meanings together.
struct TroubleCode
{
    /// What one maker means by a code.
    struct Meaning
    {
        std::string maker; ///< "Generic", a maker, or "Unknown"
        std::string text;  ///< the meaning

        bool operator==(Meaning const&) const = default; ///< maker and text
    };

    std::string code;              ///< "P0171"
    std::string system;            ///< "Powertrain", "Body", "Chassis", "Network" or "Undefined"
    std::vector<Meaning> meanings; ///< all that the catalogue has
    std::string maker = {};        ///< whose meanings hold for the vehicle; empty for nobody known
};

/// Whose meanings a vehicle's trouble codes are read with.
struct MakerChoice
{
    /// What the choice rests on.
    enum class By
    {
        Nothing,
        Option, ///< the user named the maker
        Vin,    ///< the vehicle identification number tells it, and its control modules are known to follow that list
        Guess,  ///< the number tells a related maker, which is only offered
    };

    By by = By::Nothing; ///< what it rests on
    std::string maker;   ///< as the trouble code catalogue writes it

    /// The maker whose meanings hold; empty for nobody.
    VELMORA_EXPORT std::string const& holding() const;
};

/// How firmly a trouble code is stored.
enum class CodeKind : int
{
    Confirmed, ///< stored, and as a rule the reason for the lamp
    Pending,   ///< seen in this or the last driving cycle
    Permanent, ///< not to be cleared by a tool
};

/// A trouble code as it is stored in one control module.
struct StoredCode
{
    unsigned int module; ///< id of the control module
    CodeKind kind;       ///< of the list that holds it
    TroubleCode code;    ///< with its meanings
};

/// What a control module tells of its codes of one kind.
struct CodeList
{
    /// How asking for the list went.
    enum class Answer : int
    {
        Read,
        Refused,
        Silent,
        Unreadable,
    };

    CodeKind kind;                  ///< of all codes in it
    Answer answer;                  ///< without codes, Read says that nothing is stored
    std::string reason;             ///< of a refusal
    std::vector<TroubleCode> codes; ///< in the order of the reply
    bool offered = true;            ///< false if the refusal says that the module does not have the list
};

/// Lamp and trouble codes of one control module.
struct CodeReport
{
    std::optional<bool> lamp;                     ///< whether the malfunction indicator is on
    std::vector<CodeList> lists;                  ///< one for each kind
    MakerChoice maker = {};                       ///< whose meanings the codes are given
    TopicAnswer lampAnswer = TopicAnswer::Silent; ///< why there is no lamp, where there is none
};

/// "confirmed", "pending" or "permanent".
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, CodeKind kind);
/// "P0171 System Too Lean Bank 1": the code with the meaning that holds for the vehicle, or how many it may have.
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, TroubleCode const& code);
/// "7E8 confirmed P0171 System Too Lean Bank 1"
VELMORA_EXPORT std::ostream& operator<<(std::ostream& out, StoredCode const& code);

} // namespace velmora
