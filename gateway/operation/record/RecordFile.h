#pragma once

#include "operation/record/LineFile.h"
#include "operation/record/RecordTarget.h"

#include <string>

/// Records in a file, a line each.
class RecordFile : public RecordTarget
{
public:
    /// Throws std::runtime_error when the file cannot be opened.
    explicit RecordFile(std::string const& name) : m_name(name), m_file(name) {}

    /// Its last lines: one of them may have been written by a process that was killed before it could note that.
    std::string getTail() const { return m_file.getTail(); }

    // --- RecordTarget
    std::size_t take(RecordLines const& lines) override;
    void reopen() override;

private:
    std::string m_name;
    LineFile m_file;
};
