#include "Sound.h"
#include "media/file/WaveFile.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <unistd.h>

namespace
{
/// A file of its own that goes with the test.
class WaveFile : public testing::Test
{
protected:
    ~WaveFile() override { std::filesystem::remove(path); }
    std::string path = (std::filesystem::temp_directory_path() / ("sound." + std::to_string(getpid()))).string();
};
} // namespace

TEST_F(WaveFile, WhatWasWrittenIsReadBack)
{
    std::vector<short> const sound = Sound::SINE(440, 16000, 1600, 30000);
    {
        WaveWriter writer;
        ASSERT_TRUE(writer.open(path, 16000));
        EXPECT_TRUE(writer.write(std::span(sound).first(1000)));
        EXPECT_TRUE(writer.write(std::span(sound).subspan(1000)));
    }
    WaveReader reader;
    ASSERT_TRUE(reader.read(path));
    EXPECT_EQ(reader.getRate(), 16000u);
    EXPECT_EQ(reader.getSamples(), sound);
}

TEST_F(WaveFile, WhatWasFlushedIsThereBeforeTheEnd)
{
    WaveWriter writer;
    ASSERT_TRUE(writer.open(path, 8000));
    writer.write(std::vector<short>(100, 7));
    writer.flush();
    WaveReader reader;
    ASSERT_TRUE(reader.read(path));
    EXPECT_EQ(reader.getSamples(), std::vector<short>(100, 7));
}

TEST_F(WaveFile, TwoChannelsBecomeOneAndUnknownPiecesArePassedOver)
{
    std::string const text(
        "RIFF\x3a\0\0\0WAVELIST\x03\0\0\0abc\0fmt \x10\0\0\0\x01\0\x02\0\x40\x1f\0\0\0\x7d\0\0\x04\0\x10\0"
        "data\x08\0\0\0\x02\0\x04\0\xfe\xff\xfc\xff",
        64);
    WaveReader reader;
    ASSERT_TRUE(reader.read(std::vector<unsigned char>(text.begin(), text.end())));
    EXPECT_EQ(reader.getRate(), 8000u);
    EXPECT_EQ(reader.getSamples(), (std::vector<short>{3, -3}));
}

TEST_F(WaveFile, WhatIsNoSoundIsRefusedAtEachLength)
{
    WaveWriter writer;
    ASSERT_TRUE(writer.open(path, 8000));
    EXPECT_FALSE(WaveReader().read("/nowhere/at/all"));
    EXPECT_FALSE(writer.open("/nowhere/at/all", 8000));
    std::string const text(
        "RIFF\x24\0\0\0WAVEfmt \x10\0\0\0\x01\0\x01\0\x40\x1f\0\0\x80\x3e\0\0\x02\0\x10\0data\0\0\0\0", 44);
    std::vector<unsigned char> const whole(text.begin(), text.end());
    for (std::size_t length = 0; length < whole.size(); ++length)
        EXPECT_FALSE(WaveReader().read(std::span(whole).first(length))) << length;
    EXPECT_TRUE(WaveReader().read(whole));
    std::vector<unsigned char> packed = whole;
    packed[20] = 6; // A-law
    EXPECT_FALSE(WaveReader().read(packed));
}
