#include "diagnosis/CC_Recording.h"

#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "recorder/CC_Recorder.h"
#include "testing/CallControlFixture.h"

#include <algorithm>
#include <cstring>
#include <gtest/gtest.h>
#include <random>
#include <span>
#include <string>
#include <vector>

namespace
{
using CC_RecordFormat::Header;
using Image = std::vector<std::byte>;

CC_Recording READ(Image const& image) { return CC_Recording::READ(image); }

/// A recording that has gone round its ring several times.
class CC_Recording_Test : public testing::Test
{
protected:
    CC_Recording_Test()
    {
        EXPECT_EQ(CC_Recorder::START(CC_Recorder::LEAST_SIZE), XCode::OK);
        auto* const leg = new CC_CallLeg;
        for (unsigned int i = 0; i < 200; ++i)
            EXPECT_EQ(leg->setProperty(CC_PropertyString(CC_PropertyId::NAME, std::to_string(i).c_str())), XCode::OK);
        leg->removeReference();
        std::span<std::byte const> const now = CC_Recorder::GET_IMAGE();
        image.assign(now.begin(), now.end());
        CC_Recorder::CLOSE();
        whole = READ(image).getEvents().size();
    }

    Header header() const
    {
        Header header;
        std::memcpy(&header, image.data(), sizeof header);
        return header;
    }
    void set(Header const& header) { std::memcpy(image.data(), &header, sizeof header); }

    CallControlFixture fixture;
    Image image;
    std::size_t whole = 0;
};
} // namespace

TEST_F(CC_Recording_Test, AWholeOneHasNothingToComplainOf)
{
    EXPECT_EQ(READ(image).getComplaint(), "");
    EXPECT_GT(whole, 20u);
}

TEST_F(CC_Recording_Test, SaysWhatIsNoRecording)
{
    EXPECT_EQ(READ({}).getComplaint(), "it is too short for a recording");
    EXPECT_EQ(READ(Image(1000)).getComplaint(), "it is no recording");
    EXPECT_EQ(CC_Recording::READ_FILE("/no/such/file").getComplaint(), "it cannot be read");
    EXPECT_EQ(CC_Recording::READ_FILE("/tmp").getComplaint(), "it cannot be read") << "a folder";
}

TEST_F(CC_Recording_Test, SaysWhichVersionItCannotRead)
{
    Header other = header();
    other.version = 7;
    set(other);
    EXPECT_EQ(READ(image).getComplaint(), "it has version 7, this reads version 3");
    EXPECT_TRUE(READ(image).getEvents().empty());
    other.byteOrder = 0x04030201;
    set(other);
    EXPECT_EQ(READ(image).getComplaint(), "it was written by a machine of another byte order");
}

TEST_F(CC_Recording_Test, OneThatIsCutOffIsReadAsFarAsItGoes)
{
    std::size_t lastCount = whole;
    for (std::size_t size = image.size() - 1; size >= sizeof(Header); size -= 97)
    {
        CC_Recording const recording = CC_Recording::READ(std::span(image).first(size));
        EXPECT_NE(recording.getComplaint().find("it is cut off"), std::string::npos) << size;
        EXPECT_LE(recording.getEvents().size(), lastCount);
        lastCount = recording.getEvents().size();
    }
    EXPECT_LT(lastCount, 3u);
}

TEST_F(CC_Recording_Test, ATornRecordIsLeftOutAndTheOthersAreRead)
{
    Header const before = header();
    auto const end = static_cast<std::size_t>(sizeof(Header) + (before.head - 8) % before.capacity + 8);
    auto const middle = static_cast<std::size_t>(sizeof(Header) + before.capacity / 16 * 8);
    for (std::size_t const behind : {end, middle})
    {
        Image torn = image;
        std::fill_n(torn.begin() + static_cast<long>(behind) - 128, 128, std::byte{0xee});
        CC_Recording const recording = READ(torn);
        EXPECT_NE(recording.getComplaint().find("octets hold no record that could be read"), std::string::npos);
        EXPECT_GE(recording.getEvents().size(), whole - 4);
        EXPECT_LT(recording.getEvents().size(), whole);
    }
}

TEST_F(CC_Recording_Test, WhatWasOverwrittenWhileItWasReadIsLeftOut)
{
    // the header of before, with the ring of later: as one finds the file of a process that goes on writing
    Image later = image;
    Header earlier = header();
    earlier.head -= earlier.capacity / 2;
    earlier.tail -= earlier.capacity / 2 / 8 * 8;
    std::memcpy(later.data(), &earlier, sizeof earlier);
    CC_Recording const recording = READ(later);
    EXPECT_LT(recording.getEvents().size(), whole);
    EXPECT_GT(recording.getEvents().size(), 0u);
}

TEST_F(CC_Recording_Test, AHeaderOfNonsenseKeepsNobodyBusy)
{
    for (std::uint64_t const value : {std::uint64_t{0}, std::uint64_t{7}, ~std::uint64_t{0}, ~std::uint64_t{7}})
    {
        Header damaged = header();
        damaged.capacity = value;
        set(damaged);
        EXPECT_NE(READ(image).getComplaint(), "");
        damaged.tail = 0;
        damaged.head = value & ~std::uint64_t{7};
        set(damaged);
        EXPECT_NE(READ(image).getComplaint(), "");
    }
}

TEST_F(CC_Recording_Test, AnyOctetsAreSurvived)
{
    std::mt19937 random(7);
    for (unsigned int round = 0; round < 2000; ++round)
    {
        Image damaged = image;
        for (auto i = random() % 20; i-- > 0;)
            damaged[random() % damaged.size()] = static_cast<std::byte>(random());
        EXPECT_LE(READ(damaged).getEvents().size(), 2 * whole);
    }
}
