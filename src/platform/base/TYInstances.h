#pragma once

/// The objects of a class that are alive, for who has to find them without having been told of each.
///
/// Each object bears its two links itself: coming and going costs a few stores and no memory, and an object may go at
/// any time, unless somebody is just walking. It owns nothing. One thread only.
///
///     class CC_CallLeg
///     {
///         CC_CallLeg() { s_instances.add(*this); }
///         ~CC_CallLeg() { s_instances.remove(*this); }
///     private:
///         friend class TYInstances<CC_CallLeg>;
///         TYInstances<CC_CallLeg>::Links m_links;
///         static TYInstances<CC_CallLeg> s_instances;
///     };
template <class T>
class TYInstances
{
public:
    /// A member of each object, `m_links`.
    struct Links
    {
        T* older = nullptr;      ///< the one made before
        T** fromNewer = nullptr; ///< the pointer that leads here: a newer one's `older`, or the list's
    };

    /// As the newest.
    void add(T& object)
    {
        object.m_links.older = m_newest;
        object.m_links.fromNewer = &m_newest;
        if (m_newest != nullptr)
            m_newest->m_links.fromNewer = &object.m_links.older;
        m_newest = &object;
    }
    /// REQUIRES: it was added.
    void remove(T& object)
    {
        Links const& links = object.m_links;
        *links.fromNewer = links.older;
        if (links.older != nullptr)
            links.older->m_links.fromNewer = links.fromNewer;
    }

    /// Calls `visit(object)` for each, the newest first. REQUIRES: none comes or goes meanwhile.
    template <class Visit>
    void forEach(Visit&& visit) const
    {
        for (T* object = m_newest; object != nullptr; object = object->m_links.older)
            visit(*object);
    }

private:
    T* m_newest = nullptr;
};
