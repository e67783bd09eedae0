#pragma once

#include <memory>
#include <vector>

/// Sound in memory, as a file holds it: shared by all who play it and never changed.
struct RecordedSound
{
    unsigned int rate = 8000; ///< Hz
    std::vector<short> samples;
};
using SharedSound = std::shared_ptr<RecordedSound const>;
