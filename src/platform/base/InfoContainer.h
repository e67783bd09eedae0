#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/TYVector.h"

/// Collects the lines of a diagnostic dump as a tree.
///
/// Every diagnosable object has `getInfo(info, maxLevel, level, maxDetail, detail, prefix)`: it adds its own lines at
/// `level`, lets its children add theirs at `level` + 1, and leaves out what lies below `maxLevel` or is finer than
/// `maxDetail`.
///
/// Tree format: one line per entry, two blanks per level, then "key: text", or the key alone when the text is empty.
/// Levels need not be contiguous: an entry is indented by its own level whether or not a parent stands above it, and a
/// heading (a key alone) may stand above entries of any deeper level. Line breaks inside a text are kept, each further
/// line indented like the entry's children. Three settings, all 0 unless given, change the layout:
///
/// - the key width: blanks behind "key:" let the text begin in that column, counted from the margin, the first being
///   column 0. A key that reaches it is followed by one blank.
/// - the margin: so many blanks stand before every line.
/// - the base level: entries of that level stand at the margin, deeper ones two blanks per level to the right of it,
///   higher ones at the margin as well.
///
/// A NUL octet in a key or text is rendered like any other; std::puts and "%s" end there.
///
///     InfoContainer info;
///     CallControl::GET_CALL_INFO(info, "SWITCH", 9, 0, 9, 0, "");
///     std::puts(info.getString_TreeFormat().c_str());
class CC_EXPORT InfoContainer
{
public:
    /// One line of the dump.
    struct Entry
    {
        /// What `add` was given. @{
        unsigned int level;
        unsigned int detail;
        String key;
        String text;
        /// @}
    };

    /// Adds finished text; nothing is formatted here. When memory is out the entry is dropped and the dump is marked
    /// incomplete.
    void add(unsigned int level, unsigned int detail, String const& key, String const& text);

    /// Adds prefix + label and the text if `level` and `detail` do not exceed their limits.
    void addWithin(unsigned int maxLevel, unsigned int level, unsigned int maxDetail, unsigned int detail,
                   String const& prefix, char const* label, String const& text);

    /// Lines so far.
    unsigned int getNumberOfEntries() const { return static_cast<unsigned int>(m_entries.getSize()); }
    /// REQUIRES: index < getNumberOfEntries()
    Entry const& getEntry(unsigned int index) const { return m_entries[index]; }
    /// Whether memory has kept a line out.
    bool isIncomplete() const { return m_isIncomplete; }
    /// For a getInfo that lacked memory before it could add.
    void markIncomplete() { m_isIncomplete = true; }

    /// The whole dump; its last line says so when it is incomplete. Throws std::bad_alloc when memory is out.
    String getString_TreeFormat() const;
    /// The same in `out`, which it replaces and returns, laid out with key width, margin and base level as above.
    String& getString_TreeFormat(String& out, unsigned int keyWidth, unsigned int margin, unsigned int baseLevel) const;

private:
    TYVector<Entry> m_entries;
    bool m_isIncomplete = false;
};
