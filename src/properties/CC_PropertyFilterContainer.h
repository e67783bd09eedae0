#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/TYList.h"
#include "platform/base/XCode.h"
#include "properties/CC_PropertyFilter.h"

class CC_FilterNotes;

/// Filters in the order in which they are applied. It owns copies of what it is given.
///
/// Made and filled by whoever made the endpoint that it is handed to; the endpoint only borrows it. Filled before it is
/// attached and only read afterwards; not locked. A filter that changes the container from its own operations all the
/// same finds it whole: what it removes is not applied any more, what it adds is.
///
///     CC_PropertyFilterContainer outputFilters;
///     if (outputFilters.addFilter(WithholdName()).isOk())
///         endpoint.setOutputFilterContainer(&outputFilters);
class CC_EXPORT CC_PropertyFilterContainer
{
public:
    CC_PropertyFilterContainer() = default;
    ~CC_PropertyFilterContainer();
    CC_PropertyFilterContainer(CC_PropertyFilterContainer const&) = delete;
    CC_PropertyFilterContainer& operator=(CC_PropertyFilterContainer const&) = delete;

    /// The positions of `getFilter` are those below it.
    unsigned int getNumberOfFilters() const { return m_filters.getCount(); }
    /// The filter at that position (0 is applied first), null past the end, and while the one that it replaces ends. It
    /// stays the container's.
    CC_PropertyFilter const* getFilter(unsigned int index) const;

    /// Appends a copy: OK, or NO_ELEMENT when memory is out; nothing changes then.
    XCode addFilter(CC_PropertyFilter const& filter);
    /// Inserts a copy at that position, at the end for one past it. Results as above.
    XCode addFilter(CC_PropertyFilter const& filter, unsigned int index);
    /// Puts a copy in place of the filter at that position; past the end it is appended. Results as above.
    XCode replaceFilter(CC_PropertyFilter const& filter, unsigned int index);
    /// Deletes the filter at that position; past the end nothing happens.
    void removeFilter(unsigned int index);

    /// Applies all filters in order, each to what the ones before have left, also after one has failed. The first
    /// code that is not OK, otherwise OK.
    XCode applyFilters(CC_PropertyContainer& properties) const;

    /// Adds the line "Call-Control Property Filter Container" and, unless this dump is already part of such a one, the
    /// filters one level below it. Returns `info`.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;

private:
    using Element = TYList<CC_PropertyFilter*>::Element;
    class Changes;
    template <class Visit>
    void forEach(Visit const& visit) const;
    bool isThere(Element const* element) const;
    Element* find(unsigned int index) const;
    XCode insert(CC_PropertyFilter* owned, unsigned int index);
    XCode applyRecorded(CC_PropertyContainer& properties, CC_FilterNotes* notes) const;

    TYList<CC_PropertyFilter*> m_filters;
    unsigned int m_changes = 0; // of the list: whoever walks over it finds its place again only after one
};
