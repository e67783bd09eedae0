#pragma once

/// How the test and a module built with a release's headers talk: plain functions, so that no class of either side's
/// headers crosses but those of the library.
struct ReleasedModule
{
    void* (*getProvider)();                         ///< a CC_Provider
    unsigned int (*dial)(char const* providerName); ///< the value of the XCode
    void (*answer)();
    void (*hangUp)();
    char const* (*takeStory)(); ///< what the module saw since the last time; holds until the next call
    void (*end)();              ///< destroys the module
};

using MakeReleasedModule = ReleasedModule const* (*)();
