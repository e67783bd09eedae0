#pragma once

#include "platform/base/TYSmallVector.h"

/// Which filters made which properties different, of one write that passes through filters while it is recorded.
///
///     CC_FilterNotes notes;
///     CC_Writing const writing(CC_RecordFormat::Writer::OWN, leg.getSerial(), &notes);
///     filters.applyFilters(properties); // notes what each of them does
class CC_FilterNotes
{
public:
    struct Note
    {
        unsigned int id;
        unsigned int place; // of the filter in its list, from 0
        char const* name;   // of its class, as the compiler writes it; lives as long as the class's library
    };

    /// The filter that made the property different last; null when none did. Without memory a filter goes unnoticed.
    Note const* find(unsigned int id) const
    {
        for (unsigned int i = m_notes.getSize(); i-- > 0;)
            if (m_notes[i].id == id)
                return &m_notes[i];
        return nullptr;
    }
    void add(Note const& note) { static_cast<void>(m_notes.append(note)); }

private:
    TYSmallVector<Note, 16> m_notes;
};
