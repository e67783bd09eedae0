#pragma once

#include <new>

/// A doubly linked list of values in the order in which they were appended, with a count.
///
/// `append` returns the value's element, by which it can be removed again in constant time.
template <class T>
class TYList
{
public:
    /// One value of the list.
    class Element
    {
    public:
        /// The value may be replaced in its place. Behind the last element comes null. @{
        T const& getValue() const { return m_value; }
        void setValue(T const& value) { m_value = value; }
        Element* getNext() const { return m_next; }
        /// @}

    private:
        friend class TYList;
        explicit Element(T const& value) : m_value(value) {}
        T m_value;
        Element* m_previous = nullptr;
        Element* m_next = nullptr;
    };

    TYList() = default;
    ~TYList() { clear(); }
    TYList(TYList const&) = delete;
    TYList& operator=(TYList const&) = delete;

    /// The elements in their order; the first is null when there is none. @{
    unsigned int getCount() const { return m_count; }
    bool isEmpty() const { return m_count == 0; }
    Element* getFirst() const { return m_first; }
    /// @}

    /// The first element that holds `value`, or null.
    Element* find(T const& value) const
    {
        Element* element = m_first;
        while (element != nullptr && !(element->m_value == value))
            element = element->m_next;
        return element;
    }

    /// The new last element, or null when memory is out; the list is then unchanged.
    Element* append(T const& value)
    {
        Element* const element = CREATE(value);
        if (element == nullptr)
            return nullptr;
        element->m_previous = m_last;
        (m_last != nullptr ? m_last->m_next : m_first) = element;
        m_last = element;
        ++m_count;
        return element;
    }

    /// REQUIRES: `element` is one of this list. It is freed.
    void remove(Element* element)
    {
        (element->m_previous != nullptr ? element->m_previous->m_next : m_first) = element->m_next;
        (element->m_next != nullptr ? element->m_next->m_previous : m_last) = element->m_previous;
        --m_count;
        delete element;
    }

    /// Frees all elements.
    void clear()
    {
        while (m_first != nullptr)
            remove(m_first);
    }

private:
    static Element* CREATE(T const& value)
    {
        try
        {
            return new Element(value); // copying the value may need memory as well
        }
        catch (std::bad_alloc const&)
        {
            return nullptr;
        }
    }

    Element* m_first = nullptr;
    Element* m_last = nullptr;
    unsigned int m_count = 0;
};
