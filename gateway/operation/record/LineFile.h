#pragma once

#include <string>
#include <string_view>
#include <sys/types.h>

/// A file of lines that only grows by whole ones: a piece of one, at its end, is cut off. What is no regular file is
/// left as it is. For its owner and the group alone: numbers are nobody else's business.
///
///     LineFile file("/var/log/calls.jsonl");
///     if (!file.append("{...}")) // the disk is full
class LineFile
{
public:
    /// Throws std::runtime_error when it cannot be opened.
    explicit LineFile(std::string const& name);
    ~LineFile();
    LineFile(LineFile const&) = delete;
    LineFile& operator=(LineFile const&) = delete;

    /// The line without its break; false: it is not there, nor a piece of it.
    bool append(std::string_view line);
    /// Goes on in a file of that name, which may be a new one; false: in the one that it has.
    bool reopen();
    /// Makes the file this process's alone; false: another has it.
    bool lock();
    /// The octets from there on, at most as many. Throws std::bad_alloc.
    std::string read(off_t from, std::size_t most) const;
    off_t getSize() const;
    bool cut(off_t size);
    /// Its last lines, up to a megabyte; empty: there are none. Throws std::bad_alloc.
    std::string getTail() const;

private:
    bool isRegular() const;
    void cutPiece();

    std::string m_name;
    int m_descriptor;
};
