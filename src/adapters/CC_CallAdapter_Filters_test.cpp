#include "testing/RecordingCallLegObserver.h"
#include "tests/support/TestLine.h"

#include <new>

namespace
{
using namespace CC_PropertyId;

XCode REFUSE_ALL(CC_PropertyContainer&) { return XCode::REFUSED; }

XCode REMOVE_NAME(CC_PropertyContainer& properties)
{
    properties.remove(NAME);
    return XCode::OK;
}

XCode REWRITE_NUMBER(CC_PropertyContainer& properties)
{
    auto const* const number = dynamic_cast<CC_PropertyString const*>(properties.get(E164_NUMBER));
    return number == nullptr ? XCode::OK : properties.set(CC_PropertyString(E164_NUMBER, "+" + number->getValue()));
}

XCode DERIVE_DISPLAY(CC_PropertyContainer& properties)
{
    String text;
    for (unsigned int const id : {NAME, E164_NUMBER})
        if (auto const* const part = dynamic_cast<CC_PropertyString const*>(properties.get(id)))
            text += part->getValue();
    return properties.set(CC_PropertyString(DISPLAY, text));
}

class CC_CallAdapter_Filters_Test : public TestLines
{
protected:
    CC_CallAdapter_Filters_Test() { connect(); }
};
} // namespace

// --- input -----------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Filters_Test, AnInputFilterMayRemoveAProperty)
{
    a.filterInput(REMOVE_NAME);
    a.say(NAME, "Ada");
    EXPECT_EQ(a.leg(NAME), "-");
    EXPECT_EQ(heardBy(b), Lines());
}

TEST_F(CC_CallAdapter_Filters_Test, AnInputFilterMayRewriteAProperty)
{
    a.filterInput(REWRITE_NUMBER);
    a.say(E164_NUMBER, "49");
    EXPECT_EQ(a.leg(E164_NUMBER), "+49");
    EXPECT_EQ(heardBy(b), Lines{"b: peer changed (E164-Number)"});
    EXPECT_EQ(b.peer(E164_NUMBER), "+49");
}

TEST_F(CC_CallAdapter_Filters_Test, AnInputFilterMayDeriveOnePropertyFromSeveralSetOneByOne)
{
    a.filterInput(DERIVE_DISPLAY);
    a.say(NAME, "Ada");
    EXPECT_EQ(a.leg(DISPLAY), "Ada");
    a.say(E164_NUMBER, "49");
    EXPECT_EQ(a.leg(DISPLAY), "Ada49") << "the whole of what the adapter knows is filtered again";
}

TEST_F(CC_CallAdapter_Filters_Test, WithInputFiltersTheWholeViewIsWrittenWithOneEvent)
{
    RecordingCallLegObserver witness("w");
    a.filterInput([](CC_PropertyContainer&) { return XCode::OK; });
    ASSERT_TRUE(theCall().addCallLegObserver(&witness).isOk());
    a.say(NAME, "Ada");
    a.say(NAME, "Ada");
    EXPECT_EQ(witness.take(), (Lines{"w: a/line changed (Name)", "w: a/line changed ()"}))
        << "several are written, so there is always an event";
    theCall().removeCallLegObserver(&witness);
}

TEST_F(CC_CallAdapter_Filters_Test, UnfilteredWritesPassTheInputFiltersBy)
{
    a.filterInput(REFUSE_ALL);
    CC_PropertyContainer several;
    ASSERT_TRUE(several.set(CC_PropertyString(DISPLAY, "x")).isOk());
    EXPECT_EQ(a.adapter.setOwnPropertyUnfiltered(CC_PropertyString(NAME, "Ada")), XCode::OK);
    EXPECT_EQ(a.adapter.setOwnPropertiesUnfiltered(several), XCode::OK);
    EXPECT_EQ(a.leg(NAME) + a.leg(DISPLAY), "Adax");
    EXPECT_EQ(a.adapter.setPeerPropertyUnfiltered(CC_PropertyString(NAME, "Bob")), XCode::OK);
    EXPECT_EQ(a.adapter.setPeerPropertiesUnfiltered(several), XCode::OK);
    EXPECT_EQ(b.leg(NAME) + b.leg(DISPLAY), "Bobx");
    EXPECT_EQ(a.adapter.setCallPropertyUnfiltered(CC_PropertyString(NAME, "talk")), XCode::OK);
    EXPECT_EQ(a.adapter.setCallPropertiesUnfiltered(several), XCode::OK);
    EXPECT_EQ(a.callItself(NAME) + a.callItself(DISPLAY), "talkx");
}

TEST_F(CC_CallAdapter_Filters_Test, AFailingInputFilterFailsTheWriteAndNothingReachesTheLegOrCall)
{
    a.filterInput(REFUSE_ALL);
    CC_PropertyString const name(NAME, "Ada");
    CC_PropertyContainer several;
    ASSERT_TRUE(several.set(name).isOk());
    EXPECT_EQ(a.adapter.setOwnProperty(name), XCode::FAILURE) << "not the filter's own code";
    EXPECT_EQ(a.adapter.setOwnProperties(several), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setPeerProperty(name), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setPeerProperties(several), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setCallProperty(name), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setCallProperties(several), XCode::FAILURE);
    EXPECT_EQ(a.leg(NAME) + b.leg(NAME) + a.callItself(NAME), "---");
    EXPECT_EQ(a.own(NAME) + a.peer(NAME) + a.call(NAME), "AdaAdaAda") << "the views were written first";
}

TEST_F(CC_CallAdapter_Filters_Test, AnInputFilterThatRunsOutOfMemoryFailsTheWrite)
{
    a.filterInput([](CC_PropertyContainer&) -> XCode { throw std::bad_alloc(); });
    EXPECT_EQ(a.adapter.setOwnProperty(CC_PropertyString(NAME, "Ada")), XCode::FAILURE);
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(NAME, "Ada")), XCode::FAILURE);
    EXPECT_EQ(a.leg(NAME) + a.callItself(NAME), "--");
    a.endpoint.setInputFilterContainer(nullptr);
}

TEST_F(CC_CallAdapter_Filters_Test, PeerAndCallAreWrittenThroughTheInputFiltersToo)
{
    a.filterInput(REWRITE_NUMBER);
    EXPECT_EQ(a.adapter.setPeerProperty(CC_PropertyString(E164_NUMBER, "1")), XCode::OK);
    EXPECT_EQ(b.leg(E164_NUMBER), "+1");
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(E164_NUMBER, "2")), XCode::OK);
    EXPECT_EQ(a.callItself(E164_NUMBER), "+2");
}

TEST_F(CC_CallAdapter_Filters_Test, AWriterWhoseInputFiltersChangeTheCallIsToldToo)
{
    a.filterInput(REWRITE_NUMBER);
    EXPECT_EQ(a.adapter.setCallProperty(CC_PropertyString(E164_NUMBER, "2")), XCode::OK);
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (E164-Number)"}) << "it is not what it wrote";
    EXPECT_EQ(a.call(E164_NUMBER), "+2");
}

// --- the own view ----------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Filters_Test, TheOwnViewFollowsTheLegAsWritten)
{
    a.filterInput(REWRITE_NUMBER);
    a.say(E164_NUMBER, "49");
    EXPECT_EQ(a.own(E164_NUMBER), "+49");
    a.say(NAME, "Ada"); // the number is filtered once more, from the view
    EXPECT_EQ(a.leg(E164_NUMBER), "++49") << "a filter that is not idempotent has it so";
    EXPECT_EQ(a.own(E164_NUMBER), "++49");
}

TEST_F(CC_CallAdapter_Filters_Test, TheOwnViewHasPassedTheOutputFilters)
{
    a.filterOutput(REMOVE_NAME);
    a.say(NAME, "Ada");
    EXPECT_EQ(a.leg(NAME), "Ada");
    EXPECT_EQ(a.own(NAME), "-");
}

TEST_F(CC_CallAdapter_Filters_Test, AFailingOutputFilterLeavesTheOwnViewAsItWas)
{
    a.filterOutput(
        [](CC_PropertyContainer& properties)
        {
            properties.clear();
            return XCode::FAILURE;
        });
    a.say(NAME, "Ada");
    EXPECT_EQ(a.own(NAME), "Ada") << "as it was set";
    EXPECT_EQ(a.adapter.setOwnPropertyUnfiltered(CC_PropertyString(DISPLAY, "x")), XCode::OK);
    EXPECT_EQ(a.own(NAME) + a.own(DISPLAY), "Adax");
}

TEST_F(CC_CallAdapter_Filters_Test, TheOwnViewTakesUpWhatOthersWroteToTheLeg)
{
    EXPECT_EQ(b.adapter.setPeerProperty(CC_PropertyString(NAME, "from b")), XCode::OK);
    EXPECT_EQ(a.own(NAME), "from b");
    EXPECT_EQ(heardBy(a), Lines()) << "changes of the own leg are never reported";
}

// --- output ----------------------------------------------------------------------------------------------------------

TEST_F(CC_CallAdapter_Filters_Test, TheViewsOfPeerAndCallHavePassedTheOutputFilters)
{
    a.filterOutput(REWRITE_NUMBER);
    b.say(E164_NUMBER, "49");
    EXPECT_EQ(b.adapter.setCallProperty(CC_PropertyString(E164_NUMBER, "1")), XCode::OK);
    EXPECT_EQ(a.peer(E164_NUMBER), "+49");
    EXPECT_EQ(a.call(E164_NUMBER), "+1");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (E164-Number)"});
    EXPECT_EQ(TestLine::TEXT(a.adapter.getPeerPropertyUnfiltered(E164_NUMBER)), "49");
    EXPECT_EQ(a.callItself(E164_NUMBER), "1");
    EXPECT_EQ(b.leg(E164_NUMBER), "49") << "filters work on a copy";
}

TEST_F(CC_CallAdapter_Filters_Test, APropertyThatTheOutputFiltersRemoveIsNeverReported)
{
    a.filterOutput(REMOVE_NAME);
    b.say(NAME, "Bob");
    EXPECT_EQ(heardBy(a), Lines());
    EXPECT_EQ(a.peer(NAME), "-");
}

TEST_F(CC_CallAdapter_Filters_Test, APropertyThatTheOutputFiltersDeriveIsReported)
{
    a.filterOutput(DERIVE_DISPLAY);
    b.say(NAME, "Bob");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Name, Display)"});
    EXPECT_EQ(a.peer(DISPLAY), "Bob");
}

TEST_F(CC_CallAdapter_Filters_Test, AFailingOutputFilterShowsWhatItLeft)
{
    a.filterOutput(
        [](CC_PropertyContainer& properties)
        {
            properties.remove(NAME);
            return XCode::FAILURE;
        });
    b.say(NAME, "Bob");
    b.say(DISPLAY, "x");
    EXPECT_EQ(heardBy(a), Lines{"a: peer changed (Display)"}) << "its result is not looked at";
    EXPECT_EQ(a.peer(NAME) + a.peer(DISPLAY), "-x");
}
