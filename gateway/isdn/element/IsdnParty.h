#pragma once

#include "isdn/link/LibPri.h"
#include "platform/signalling/QNumberingPlan.h"
#include "platform/signalling/QPresentationIndicator.h"
#include "platform/signalling/QScreeningIndicator.h"
#include "platform/signalling/QTypeOfNumber.h"

#include <string>
#include <string_view>

class CC_CallAdapterE164;
class CC_PropertyContainer;
struct DialPlan;

/// Somebody who calls, is called or has answered, as the elements Calling Party Number (Q.931, 4.5.10), Called Party
/// Number (4.5.8) and Connected Number (Q.951, 5.4.1) tell of him:
///
///     octet 3, bits 7 to 5   type       Type-Of-Number
///     octet 3, bits 4 to 1   plan       Numbering-Plan
///     octet 3a, bits 7 and 6 presentation  Presentation-Indicator (not in Called Party Number)
///     octet 3a, bits 2 and 1 screening     Screening-Indicator (not in Called Party Number)
///     octets 4 and following digits     E164-Number
///     Display                           Name
///
/// A plain value. Numbers are digits, '*' and '#'; a '+' in front says that one is international.
struct IsdnParty
{
    static constexpr std::size_t LONGEST_NUMBER = 40; ///< digits; an element that is longer no peer need take
    static constexpr std::size_t LONGEST_NAME = 34;   ///< octets of Display, less than what EN 300 403 allows (82)

    std::string number;
    QTypeOfNumber type = QTypeOfNumber::UNKNOWN;
    QNumberingPlan plan = QNumberingPlan::ISDN;
    QPresentationIndicator presentation = QPresentationIndicator::ALLOWED;
    QScreeningIndicator screening = QScreeningIndicator::USER_PROVIDED_NOT_SCREENED;
    std::string name;
    std::string subaddress{}; ///< as IsdnSubaddress has it

    /// From the wire. @{
    static IsdnParty OF(pri_party_id const& id);
    static IsdnParty OF_CALLED(char const* number, int plan);
    /// @}
    /// What came from the wire as an international number, if it is one by its type or by how it is dialled here; what
    /// is neither of the ISDN's plan nor of an unknown one stays.
    IsdnParty normalised(DialPlan const& plan) const;
    /// From call control: the other side, and whom an offer is for. @{
    static IsdnParty OF_PEER(CC_CallAdapterE164 const& adapter);
    static IsdnParty OF_OFFER(CC_PropertyContainer const& properties);
    /// @}

    /// To the wire; what is no number is left out. @{
    pri_party_id getId() const;
    std::string getDigits() const;
    int getPlan() const; ///< octet 3 without its extension bit
    /// @}
    /// To call control.
    void addTo(CC_PropertyContainer& properties) const;
    /// For routing, and for properties that have no type beside them: "+49..." if international.
    std::string getText() const;
    /// The reverse.
    static IsdnParty OF_TEXT(std::string_view text);

    friend bool operator==(IsdnParty const&, IsdnParty const&) = default;
};
