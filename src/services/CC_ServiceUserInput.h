#pragma once

#include "services/CC_ServiceClass.h"

/// Tells the peer what the user has keyed in.
///
///     CC_ServiceUserInput input("12", 250);
///     leg.invokeSynchronousService(input);
class CC_EXPORT CC_ServiceUserInput : public CC_ServiceClass<CC_ServiceUserInput>
{
public:
    /// `input`: the digits. `duration`: milliseconds for which the key was held, 0 when that is not known. Throws
    /// std::bad_alloc when memory is out.
    explicit CC_ServiceUserInput(String const& input, unsigned int duration = 0);

    /// The duration is written without a unit, "Unknown" for 0.
    String getInfo() const override;
    /// The duration is written in milliseconds, "0ms" for 0: intended, unlike the line above.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// The digits, and the milliseconds for which the key was held, 0 when that is not known. @{
    String const& getInput() const { return m_input; }
    unsigned int getDuration() const { return m_duration; }
    /// @}

    static unsigned int TYPE();

private:
    String m_input;
    unsigned int m_duration;
};
