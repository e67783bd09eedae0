#pragma once

#include <string>
#include <vector>

/// What happened in a conformance case, side by side in the order in which it happened.
///
/// The one place that knows how it is kept and printed: what records calls elsewhere may take it over.
class ConformanceLadder
{
public:
    enum Column
    {
        WIRE,
        MODULE, ///< the module's leg
        PEER    ///< the other sides' legs, and what is done to them
    };

    void add(Column column, std::string text);
    void clear() { m_lines.clear(); }
    /// A line for each, indented, under a title.
    std::string getText() const;

private:
    struct Line
    {
        Column column;
        std::string text;
    };
    std::vector<Line> m_lines;
};
