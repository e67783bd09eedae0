#pragma once

#include "callcontrol/provider/CC_Endpoint.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

/// An endpoint that records what it is offered and does what the test says.
///
///     RecordingEndpoint line("line", "pstn");
///     CC_CallAdapter adapter;
///     std::ignore = adapter.setup("a", line, nullptr);
///     line.m_handleOffer = [&](CC_Call& call, String const&, CC_PropertyContainer const&)
///     { return adapter.accept(call, CC_PropertyContainer::EMPTY()); };
///     ...
///     EXPECT_EQ(line.take(), (Lines{"line: offer 4989123 (Hops)"})); // the called name, the offer's ids
class RecordingEndpoint : public CC_Endpoint, public Recorder
{
public:
    /// Its name is the recorder's.
    explicit RecordingEndpoint(std::string name, String const& network = "network", Journal* journal = nullptr,
                               CC_PropertyFilterContainer* inputFilters = nullptr,
                               CC_PropertyFilterContainer* outputFilters = nullptr);
    ~RecordingEndpoint() override;

    String const& getName() const override { return m_name; }
    String const& getNetwork() const override { return m_network; }
    /// One line: "Endpoint" and the name.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
    /// Answers what `m_handleOffer` does; OK without it.
    XCode handleOffer(CC_Call& call, String const& name, CC_PropertyContainer const& properties) override;

    /// Runs inside `handleOffer`, after it has been recorded.
    Hook<XCode(CC_Call&, String const&, CC_PropertyContainer const&)> m_handleOffer;

private:
    String m_name;
    String m_network;
};
