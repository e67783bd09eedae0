// What the E.164 adapter leaves out on purpose: calls that do not compile.
#include "adapters/CC_CallAdapterE164.h"
#include "adapters/CC_CallAdapterE164_ValueOf.h"
#include "platform/base/String.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyCodec.h"
#include "properties/CC_PropertyString.h"

#include <utility>

namespace
{
using Wait = CC_PropertyWaitForMessage;

/// Whether nothing of that name can be called; each line stands beside one that can.
template <class Adapter>
struct Gaps
{
    using P = QPresentationIndicator;

    static_assert(requires { &Adapter::getPeerSecondE164; });
    static_assert(!requires { &Adapter::getOwnSecondE164; });
    static_assert(!requires { &Adapter::getOwnSecondTypeOfNumber; });
    static_assert(!requires { &Adapter::getOwnSecondNumberingPlan; });
    static_assert(!requires { &Adapter::getOwnSecondPresentationIndicator; });
    static_assert(!requires { &Adapter::getOwnSecondScreeningIndicator; });
    static_assert(requires { &Adapter::setOwnE164; });
    static_assert(!requires { &Adapter::setOwnSecondE164; });
    static_assert(!requires { &Adapter::setOwnSecondTypeOfNumber; });
    static_assert(!requires { &Adapter::setOwnSecondNumberingPlan; });
    static_assert(!requires { &Adapter::setOwnSecondPresentationIndicator; });
    static_assert(!requires { &Adapter::setOwnSecondScreeningIndicator; });

    static_assert(requires(Adapter const& a) { a.getOwnAlertInfo(); });
    static_assert(!requires(Adapter const& a) { a.getPeerAlertInfo(); });
    static_assert(requires(Adapter const& a) { a.getOwnQoS(); });
    static_assert(!requires(Adapter const& a) { a.getPeerQoS(); });

    static_assert(requires(Adapter const& a) { a.getInformationTransferCapability(); });
    static_assert(!requires(Adapter const& a) { a.getOwnInformationTransferCapability(); });
    static_assert(!requires(Adapter const& a) { a.getPeerInformationTransferCapability(); });
    static_assert(!requires { &Adapter::setInformationTransferCapability; });
    static_assert(!requires { &Adapter::setOwnInformationTransferCapability; });

    static_assert(requires(Adapter const& a) { a.getPeerCauseProperty(); });
    static_assert(!requires(Adapter const& a) { a.getOwnCauseProperty(); });
    static_assert(!requires { &Adapter::setOwnCauseProperty; });

    // code and type are written with their state
    static_assert(!requires { &Adapter::setOwnCodecNegotiatingCode; });
    static_assert(!requires { &Adapter::setOwnWaitForMessageType; });
    static_assert(requires(Adapter & a) { a.setOwnWaitForMessageState(Wait::IDLE, Wait::PRACK); });

    // the getters with an argument have no default for it
    static_assert(requires(Adapter const& a, P p) { a.getPeerPresentationIndicator(p); });
    static_assert(!requires(Adapter const& a) { a.getPeerPresentationIndicator(); });
    static_assert(!requires(Adapter const& a) { a.getPeerScreeningIndicator(); });
    static_assert(!requires(Adapter const& a) { a.getPeerSecondPresentationIndicator(); });
    static_assert(!requires(Adapter const& a) { a.getPeerSecondScreeningIndicator(); });
    static_assert(!requires(Adapter const& a, P p) { a.getOwnPresentationIndicator(p); });

    // existence is asked for where a value alone cannot tell
    static_assert(requires(Adapter const& a) { a.existsPeerCodec(); });
    static_assert(!requires { &Adapter::existsPeerNetwork; });
    static_assert(!requires { &Adapter::existsPeerCallLegId; });
    static_assert(!requires { &Adapter::existsPeerE164; });
    static_assert(!requires { &Adapter::existsPeerTypeOfNumber; });
    static_assert(!requires { &Adapter::existsPeerNumberingPlan; });
    static_assert(!requires { &Adapter::existsPeerDiversionPresentationIndicator; });
    static_assert(!requires { &Adapter::existsPeerDiversionScreeningIndicator; });
    static_assert(!requires { &Adapter::existsPeerSecondE164; });
    static_assert(!requires { &Adapter::existsPeerSecondTypeOfNumber; });
    static_assert(!requires { &Adapter::existsPeerSecondNumberingPlan; });
    static_assert(!requires { &Adapter::existsPeerInformationTransferCapability; });
    static_assert(!requires { &Adapter::existsPeerPrecallService; });
    static_assert(!requires { &Adapter::existsPeerName; });
    static_assert(!requires { &Adapter::existsPeerRedirectingE164; });
    static_assert(!requires { &Adapter::existsPeerRedirectingName; });
    static_assert(!requires { &Adapter::existsPeerRedirectingReason; });
    static_assert(!requires { &Adapter::existsPeerIsIsdn; });
    static_assert(!requires { &Adapter::existsPeerRedirectingFirstE164; });
    static_assert(!requires { &Adapter::existsPeerRedirectingFirstName; });
    static_assert(!requires { &Adapter::existsPeerRedirectingFirstReason; });
    static_assert(!requires { &Adapter::existsPeerRedirectingCounter; });
    static_assert(!requires { &Adapter::existsPeerAlertInfo; });
    static_assert(!requires { &Adapter::existsPeerConnectedNrUpdate; });
    static_assert(!requires { &Adapter::existsPeerXOrgConnID; });
    static_assert(!requires { &Adapter::existsPeerUserToUser; });
    static_assert(!requires { &Adapter::existsPeerDisplay; });
    static_assert(!requires { &Adapter::existsPeerCodecNegotiatingState; });
    static_assert(!requires { &Adapter::existsPeerCodecNegotiatingCode; });
    static_assert(!requires { &Adapter::existsPeerWaitForMessageState; });
    static_assert(!requires { &Adapter::existsPeerWaitForMessageType; });
    static_assert(!requires { &Adapter::existsPeerSupportsOverlapReceiving; });
    static_assert(!requires { &Adapter::existsPeerSupportsOverlapSending; });
    static_assert(!requires { &Adapter::existsPeerTariff; });
    static_assert(!requires { &Adapter::existsPeerCharge; });
    static_assert(!requires { &Adapter::existsPeerCauseProperty; });
    static_assert(!requires { &Adapter::existsPeerQoS; });
    static_assert(!requires { &Adapter::existsOwnCodec; });

    // one writes to the own leg alone
    static_assert(!requires { &Adapter::setPeerE164; });
    static_assert(!requires(Adapter const& a, String const& s) { a.setOwnE164(s); });
};
template struct Gaps<CC_CallAdapterE164>;

/// Whether a default of that kind serves a result by reference.
template <class Property, class Default>
concept IsDefault = requires(Default&& absent)
{
    VALUE_OF<Property>(nullptr, std::forward<Default>(absent));
};

static_assert(IsDefault<CC_PropertyString, String const&>);
static_assert(IsDefault<CC_PropertyString, String&>);
static_assert(!IsDefault<CC_PropertyString, String>, "a temporary would be gone when the result is read");
static_assert(!IsDefault<CC_PropertyString, String const>);
static_assert(!IsDefault<CC_PropertyString, char const*>, "becomes a temporary");
static_assert(!IsDefault<CC_PropertyCodec, VoipCodecAndMode>);
static_assert(IsDefault<CC_PropertyBoolean, bool>, "a small value is copied");
template <class Property>
concept HasBuiltInDefault = requires
{
    VALUE_OF<Property>(nullptr);
};
static_assert(HasBuiltInDefault<CC_PropertyBoolean> && !HasBuiltInDefault<CC_PropertyString>);
} // namespace
