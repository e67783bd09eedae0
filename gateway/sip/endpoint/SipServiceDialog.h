#pragma once

#include "services/CC_ServiceClass.h"

#include <string>

/// Asks the other side of a call for its dialog, so that somebody can be sent there to take the place of ours (RFC
/// 3891). What it says is there when the service has been invoked; a side that is no SIP dialog, or none that is up,
/// leaves it empty.
///
///     SipServiceDialog dialog;
///     adapter.invokeSynchronousService(dialog);
///     if (!dialog.target.empty())
///         ... // "<" + dialog.target + "?" + dialog.headers + ">"
class SipServiceDialog : public CC_ServiceClass<SipServiceDialog>
{
public:
    String getInfo() const override { return "Dialog"; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    static unsigned int TYPE();

    std::string target;  ///< the URI of its peer
    std::string headers; ///< Replaces, as the headers of a URI
};
