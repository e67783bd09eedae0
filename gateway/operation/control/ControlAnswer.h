#pragma once

#include <string>
#include <vector>

/// What a request gets: lines, or the reason why there are none.
struct ControlAnswer
{
    std::vector<std::string> lines;
    std::string error; ///< empty: none

    /// As it goes over the socket: a line with the status, the lines, and an empty one.
    std::string getText(bool isJson) const;
};
