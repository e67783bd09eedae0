#pragma once

#include "operation/record/RecordTarget.h"

#include <string>

/// A database of records, of which it has each once, by its key, however often it gets it. One thread.
class RecordStore
{
public:
    enum class Result
    {
        STORED,
        AWAY,   ///< for now, whatever the lines are
        REFUSED ///< it will never have the lines together
    };

    RecordStore() = default;
    RecordStore(RecordStore const&) = delete;
    RecordStore& operator=(RecordStore const&) = delete;
    virtual ~RecordStore() = default;

    /// Stores all of the lines or none. May take some seconds. Throws std::bad_alloc.
    virtual Result store(RecordLines const& lines) = 0;
    /// Why it did not, in words that name neither a password nor where it is.
    std::string const& getReason() const { return m_reason; }

protected:
    std::string m_reason;
};
