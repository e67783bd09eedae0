#include "operation/Recording.h"

#include "configuration/Configuration.h"
#include "recorder/CC_Recorder.h"

Recording::Recording(Configuration const& configuration)
{
    if (configuration.recordingSize == 0)
        return;
    bool const isFile = !configuration.recording.empty();
    XCode const result = isFile ? CC_Recorder::OPEN(configuration.recording.c_str(), configuration.recordingSize)
                                : CC_Recorder::START(configuration.recordingSize);
    if (result == XCode::NO_ELEMENT)
        throw ConfigurationError(configuration.file, "gateway.recording-size", "there is no room for so much");
    if (!result.isOk())
        throw ConfigurationError(configuration.file, "gateway.recording", "the file cannot be made");
}

Recording::~Recording() { CC_Recorder::CLOSE(); }
