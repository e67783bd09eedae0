#include "operation/Recording.h"

#include "configuration/Configuration.h"
#include "recorder/CC_Recorder.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace
{
std::string COMPLAINT_OF(std::string const& path, unsigned int size)
{
    Configuration configuration;
    configuration.file = "f";
    configuration.recording = path;
    configuration.recordingSize = size;
    try
    {
        Recording const recording(configuration);
    }
    catch (ConfigurationError const& error)
    {
        return error.what();
    }
    return "none";
}
} // namespace

TEST(Recording, LastsAsLongAsItsObject)
{
    auto recording = std::make_unique<Recording>(Configuration());
    EXPECT_TRUE(CC_Recorder::IS_ON()) << "in memory, without being asked";
    recording.reset();
    EXPECT_FALSE(CC_Recorder::IS_ON());
}

TEST(Recording, OfSizeNothingIsNone)
{
    Configuration configuration;
    configuration.recordingSize = 0;
    Recording const recording(configuration);
    EXPECT_FALSE(CC_Recorder::IS_ON());
}

TEST(Recording, AFileThatCannotBeMadeIsAFaultOfTheConfiguration)
{
    EXPECT_EQ(COMPLAINT_OF("/no/such/folder/file", 4096), "f: gateway.recording: the file cannot be made");
}
