#pragma once

#include "services/CC_ServiceClass.h"

/// Tells the peer for how long the key of the user input told before has been held by now.
///
/// `type()` gives CC_ServiceUserInput::TYPE(), while `isOfType` answers for CC_ServiceUserInputUpdate::TYPE() alone:
/// intended. A receiver that goes by `type()` treats an update as user input (and must not cast it to that class), one
/// that asks `isOfType` tells them apart.
///
///     CC_ServiceUserInputUpdate update(500);
///     leg.invokeSynchronousService(update);
class CC_EXPORT CC_ServiceUserInputUpdate : public CC_ServiceClass<CC_ServiceUserInputUpdate>
{
public:
    /// `duration`: milliseconds, 0 when that is not known.
    explicit CC_ServiceUserInputUpdate(unsigned int duration);

    unsigned int type() const override;
    /// The duration is written without a unit, "Unknown" for 0.
    String getInfo() const override;
    /// The duration is written in milliseconds, "0ms" for 0: intended, unlike the line above.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// Milliseconds so far, 0 when that is not known.
    unsigned int getDuration() const { return m_duration; }

    static unsigned int TYPE();

private:
    unsigned int m_duration;
};
