#pragma once

struct Configuration;

/// Call control's recorder for as long as the gateway runs: in a file that outlives it, or in memory, as the
/// configuration says.
///
///     Recording const recording(configuration); // before call control does anything
class Recording
{
public:
    /// Throws ConfigurationError when the file or the memory cannot be had.
    explicit Recording(Configuration const& configuration);
    ~Recording();
    Recording(Recording const&) = delete;
    Recording& operator=(Recording const&) = delete;
};
