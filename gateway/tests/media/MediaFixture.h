#pragma once

#include "FarEnd.h"
#include "media/context/CallMedia.h"
#include "media/context/MediaLayer.h"
#include "media/context/MediaLoop.h"
#include "platform/eventloop/TYEventLoop.h"
#include "testing/DrivenClock.h"

#include <gtest/gtest.h>
#include <string>

/// A leg and its far side: what was told of it, in the order of telling.
struct Side : MediaObserver
{
    explicit Side(std::string const& host = "127.0.0.1") : far(host) {}

    void onDigit(char digit, unsigned int milliseconds) override
    {
        told += std::string(1, digit) + std::to_string(milliseconds) + " ";
    }
    void onSilence(unsigned int seconds) override { told += "silence" + std::to_string(seconds) + " "; }
    void onSpeech() override { told += "speech "; }
    void onQuality(MediaQuality const& value) override { quality = value; }

    FarEnd far;
    std::unique_ptr<LegMedia> leg;
    std::string told;
    MediaQuality quality;
};

/// The media layer on loops that are turned by hand, with a clock that stands still.
class MediaFixture : public testing::Test
{
protected:
    MediaFixture() : layer(std::make_unique<MediaLayer>(OPTIONS(), signalling)) {}

    static MediaOptions OPTIONS()
    {
        MediaOptions options;
        options.threads = 2;
        options.firstPort = 12000;
        options.lastPort = 15999;
        return options;
    }
    /// A new context.
    TYPtr<CallMedia> makeCall()
    {
        TYPtr<MG_IContext> context;
        EXPECT_TRUE(layer->getContexts()->createContext(context).isOk());
        return TYPtr<CallMedia>(CallMedia::OF(context.get()));
    }
    /// One of the first loop, so that two are of the same.
    TYPtr<CallMedia> makeCallOfTheSameLoop()
    {
        TYPtr<CallMedia> made = makeCall();
        makeCall();
        return made;
    }
    /// What a far side that takes these codecs, numbered as in RFC 3551, says of itself.
    static MediaDescription DESCRIBE(FarEnd const& far, std::initializer_list<MG_Rtp::ECodec::Type> codecs)
    {
        MediaDescription description;
        description.rtp = far.getRtp();
        for (MG_Rtp::ECodec::Type const codec : codecs)
        {
            auto const type = static_cast<unsigned char>(codec < 128 ? codec : codec - 20);
            description.formats.add({VoipCodec(codec, 20), {type, type}});
        }
        return description;
    }
    /// Gives the side a leg of the call, on its own loopback address, and describes it.
    void join(Side& side, CallMedia& call, MediaDescription const& description)
    {
        side.leg = call.addLeg(side.far.getRtp().host, side);
        ASSERT_NE(side.leg, nullptr);
        side.far.setPeer(side.leg->getLocalRtp());
        side.leg->describe(description);
        turn();
    }
    void join(Side& side, CallMedia& call, std::initializer_list<MG_Rtp::ECodec::Type> codecs)
    {
        join(side, call, DESCRIBE(side.far, codecs));
    }
    /// Everything that is to do at this moment.
    void turn()
    {
        for (bool hadWork = true; hadWork;)
        {
            hadWork = false;
            for (unsigned int i = 0; i < OPTIONS().threads; ++i)
            {
                hadWork |= layer->getLoop(i).turn(0);
                hadWork |= layer->getLoop(i).getEvents().runTurn();
            }
            hadWork |= signalling.runTurn();
        }
    }
    /// Time goes by in steps of 20 ms.
    void pass(unsigned int milliseconds)
    {
        for (unsigned int passed = 0; passed < milliseconds; passed += 20)
        {
            clock.advance(20);
            turn();
        }
    }
    MediaQuality askQuality(Side& side)
    {
        side.leg->askQuality();
        turn();
        return side.quality;
    }

    DrivenClock clock;
    TYEventLoop signalling;
    std::unique_ptr<MediaLayer> layer;
};

constexpr MG_Rtp::ECodec::Type PCMU = MG_Rtp::ECodec::PCMU;
constexpr MG_Rtp::ECodec::Type PCMA = MG_Rtp::ECodec::PCMA;
constexpr MG_Rtp::ECodec::Type G722 = MG_Rtp::ECodec::G722;
constexpr MG_Rtp::ECodec::Type G729 = MG_Rtp::ECodec::G729;
constexpr MG_Rtp::ECodec::Type OPUS = MG_Rtp::ECodec::OPUS;
