#pragma once

/// The objects of a class that are alive, in the order of their making, for who has to find them without having been
/// told of each.
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
    struct Links
    {
        T* previous = nullptr;
        T* next = nullptr;
    };

    void add(T& object)
    {
        object.m_links.previous = m_last;
        (m_last != nullptr ? m_last->m_links.next : m_first) = &object;
        m_last = &object;
    }
    /// REQUIRES: it was added.
    void remove(T& object)
    {
        Links const& links = object.m_links;
        (links.previous != nullptr ? links.previous->m_links.next : m_first) = links.next;
        (links.next != nullptr ? links.next->m_links.previous : m_last) = links.previous;
    }

    /// Calls `visit(object)` for each. REQUIRES: none comes or goes meanwhile.
    template <class Visit>
    void forEach(Visit&& visit) const
    {
        for (T* object = m_first; object != nullptr; object = object->m_links.next)
            visit(*object);
    }

private:
    T* m_first = nullptr;
    T* m_last = nullptr;
};
