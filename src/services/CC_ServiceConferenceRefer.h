#pragma once

#include "services/CC_ServiceClass.h"

/// Asks the peer to bring its party into a conference.
///
///     CC_ServiceConferenceRefer refer("sip:conference-7@gateway");
///     leg.invokeSynchronousService(refer);
class CC_EXPORT CC_ServiceConferenceRefer : public CC_ServiceClass<CC_ServiceConferenceRefer>
{
public:
    /// `referTo`: where the conference is reached. Throws std::bad_alloc when memory is out.
    explicit CC_ServiceConferenceRefer(String const& referTo);

    String getInfo() const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// Where the conference is reached.
    String const& getReferTo() const { return m_referTo; }

    static unsigned int TYPE();

private:
    String m_referTo;
};
