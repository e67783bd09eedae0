#include "MediaFixture.h"
#include "testing/FailingAllocator.h"

class MediaMemory : public MediaFixture
{
};

TEST_F(MediaMemory, WhateverAllocationFailsTheCallGoesOnOrIsRefused)
{
    Side a;
    Side b;
    std::shared_ptr<RecordedSound const> const sound =
        std::make_shared<RecordedSound const>(RecordedSound{8000, std::vector<short>(8000, 100)});
    MediaDescription const ofA = DESCRIBE(a.far, {PCMA});
    MediaDescription const ofB = DESCRIBE(b.far, {G722});
    bool isComplete = false;
    unsigned long failures = 0;
    for (unsigned long n = 1; n < 1000 && !isComplete; ++n, ++failures)
    {
        FailingAllocator::failNth(n);
        TYPtr<MG_IContext> context;
        std::ignore = layer->getContexts()->createContext(context);
        if (CallMedia* const call = CallMedia::OF(context.get()))
        {
            a.leg = call->addLeg(ofA.rtp.host, a);
            b.leg = call->addLeg(ofB.rtp.host, b);
        }
        if (a.leg != nullptr && b.leg != nullptr)
        {
            a.leg->describe(ofA);
            b.leg->describe(ofB);
            a.leg->playSound(sound);
            b.leg->playTone(MG_Tones::ECallProgressTone::DIAL);
            b.leg->detectDigits(true);
            b.leg->sendDigit('1');
            pass(200);
        }
        FailingAllocator::stop();
        isComplete = !FailingAllocator::hasFailed();
        a.leg.reset();
        b.leg.reset();
        pass(20);
        a.far.hearAll();
        b.far.hearAll();
    }
    EXPECT_TRUE(isComplete);
    EXPECT_GT(failures, 20u);
    EXPECT_EQ(layer->getLoop(0).getNumberOfLegs() + layer->getLoop(1).getNumberOfLegs(), 0u);
}
