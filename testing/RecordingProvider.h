#pragma once

#include "callcontrol/provider/CC_Provider.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// A provider that records what it is asked to carry and does what the test says.
///
///     RecordingProvider isdn("isdn");
///     isdn.m_dial = [&](CC_Call& call, String const&, String const& destination, CC_PropertyContainer const& offered)
///     { return line.offer(call, destination, offered); };
///     std::ignore = CallControl::ADD_PROVIDER("SWITCH", "isdn", isdn);
///     ...
///     EXPECT_EQ(isdn.take(), (Lines{"isdn: dial isdn 4989123 (Hops)"})); // provider name, destination, offer's ids
class RecordingProvider : public CC_Provider, public Recorder
{
public:
    /// `type`: what `getProviderType` gives. `journal` must outlive it; null: it keeps one of its own.
    explicit RecordingProvider(std::string name, Journal* journal = nullptr,
                               ProviderType type = USER_DEFINED_INTERFACE);
    ~RecordingProvider() override;

    /// Answers what `m_dial` does; OK without it.
    XCode dial(CC_Call& call, String const& providerName, String const& destination,
               CC_PropertyContainer const& offerProperties) override;
    ProviderType getProviderType() const override { return m_type; }
    /// One line: "Provider" and the recorder's name.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// Runs inside `dial`, after it has been recorded.
    Hook<XCode(CC_Call&, String const&, String const&, CC_PropertyContainer const&)> m_dial;

private:
    ProviderType m_type;
};
