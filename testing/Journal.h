#pragma once

#include <cstddef>
#include <string>
#include <unordered_map>
#include <vector>

/// The lines of a journal, as tests compare them.
using Lines = std::vector<std::string>;

/// What happened, in the order in which it happened: a list of short lines.
///
/// Every recorder of the kit (see Recorder) writes one line per notification, to the journal that it is given or to one
/// of its own. Give several recorders the same journal to see their order among each other. Objects that have no name
/// of their own (calls) are printed under the one that the test gives them.
///
///     Journal journal;
///     RecordingCallObserver first("first", &journal);
///     RecordingCallObserver second("second", &journal);
///     journal.name(call, "X");
///     ...
///     EXPECT_EQ(journal.take(), (Lines{"first: a joined X", "second: a joined X"}));
class Journal
{
public:
    /// Appends the line.
    void add(std::string line);

    /// In the order in which they came.
    Lines const& getLines() const { return m_lines; }
    /// The lines so far; the journal is empty afterwards.
    Lines take();
    /// Of lines that are exactly that. @{
    bool contains(std::string const& line) const { return count(line) != 0; }
    std::size_t count(std::string const& line) const;
    /// @}
    /// Forgets the lines; the names stay.
    void clear() { m_lines.clear(); }

    /// From now on the object is printed as `text`.
    void name(void const* object, std::string text);
    /// The name given to the object, else `otherwise`; "none" for null.
    std::string nameOf(void const* object, std::string const& otherwise) const;

private:
    Lines m_lines;
    std::unordered_map<void const*, std::string> m_names;
};
