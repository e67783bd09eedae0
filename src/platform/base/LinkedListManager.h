#pragma once

#include "platform/base/XCode.h"

#include <tuple>

/// The two links by which an object sits in an intrusive list; null while it is in none. Copying an object copies
/// neither link.
class LinkedListElement_Untyped
{
public:
    LinkedListElement_Untyped() = default;
    /// Links are not copied: a copy is in no list, and what is assigned to stays where it is. @{
    LinkedListElement_Untyped(LinkedListElement_Untyped const&) {}
    LinkedListElement_Untyped& operator=(LinkedListElement_Untyped const&) { return *this; }
    /// @}

    /// Whether it sits in a list.
    bool isLinked() const { return m_next != nullptr; }

protected:
    ~LinkedListElement_Untyped() = default;

private:
    friend class LinkedListManager_Untyped;
    LinkedListElement_Untyped* m_next = nullptr;
    LinkedListElement_Untyped* m_previous = nullptr;
};

/// The links of an object of class T, as its base: `class T : public LinkedListElement<T>`.
template <class T>
class LinkedListElement : public LinkedListElement_Untyped
{
};

/// A circular intrusive list through a head of its own. It owns nothing and allocates nothing.
class LinkedListManager_Untyped
{
public:
    LinkedListManager_Untyped()
    {
        m_head.m_next = &m_head;
        m_head.m_previous = &m_head;
    }
    LinkedListManager_Untyped(LinkedListManager_Untyped const&) = delete;
    LinkedListManager_Untyped& operator=(LinkedListManager_Untyped const&) = delete;

    /// Linked elements; their number is kept, not counted anew. @{
    bool isEmpty() const { return m_head.m_next == &m_head; }
    unsigned int getCount() const { return m_count; }
    /// @}
    /// The first element, or the end.
    LinkedListElement_Untyped* getFirst() const { return m_head.m_next; }
    /// The element behind, which is the end after the last; the end is no element. @{
    LinkedListElement_Untyped* getNext(LinkedListElement_Untyped const& element) const { return element.m_next; }
    LinkedListElement_Untyped const* getEnd() const { return &m_head; }
    /// @}

    /// Links the element in at the end: OK, or REFUSED when it sits in a list already.
    XCode append(LinkedListElement_Untyped& element)
    {
        if (element.isLinked())
            return XCode::REFUSED;
        element.m_next = &m_head;
        element.m_previous = m_head.m_previous;
        m_head.m_previous->m_next = &element;
        m_head.m_previous = &element;
        ++m_count;
        return XCode::OK;
    }

    /// REQUIRES: the element is linked into this list.
    void unlink(LinkedListElement_Untyped& element)
    {
        element.m_previous->m_next = element.m_next;
        element.m_next->m_previous = element.m_previous;
        element.m_next = nullptr;
        element.m_previous = nullptr;
        --m_count;
    }

    /// Appends all elements of `other`, in their order, and leaves it empty.
    void takeAll(LinkedListManager_Untyped& other)
    {
        if (other.isEmpty())
            return;
        m_head.m_previous->m_next = other.m_head.m_next;
        other.m_head.m_next->m_previous = m_head.m_previous;
        other.m_head.m_previous->m_next = &m_head;
        m_head.m_previous = other.m_head.m_previous;
        m_count += other.m_count;
        other.m_head.m_next = &other.m_head;
        other.m_head.m_previous = &other.m_head;
        other.m_count = 0;
    }

private:
    class Head : public LinkedListElement_Untyped
    {
    };
    Head m_head;
    unsigned int m_count = 0;
};

/// An intrusive list that owns its objects: removing and clearing delete them through their destructor.
template <class T>
class LinkedListManager
{
public:
    /// For walks over the elements in their order.
    class Iterator
    {
    public:
        Iterator() = default; // no position, equal to others like it
        /// As of a standard forward iterator. REQUIRES, but for comparing: it stands on an element. @{
        explicit Iterator(LinkedListElement_Untyped* element, LinkedListManager_Untyped const& list)
            : m_element(element), m_list(&list)
        {
        }
        T& operator*() const { return TYPED(*m_element); }
        T* operator->() const { return &TYPED(*m_element); }
        Iterator& operator++()
        {
            m_element = m_list->getNext(*m_element);
            return *this;
        }
        friend bool operator==(Iterator const& left, Iterator const& right)
        {
            return left.m_element == right.m_element;
        }
        /// @}

    private:
        LinkedListElement_Untyped* m_element = nullptr;
        LinkedListManager_Untyped const* m_list = nullptr;
    };

    LinkedListManager() = default;
    ~LinkedListManager() { clear(); }
    LinkedListManager(LinkedListManager const&) = delete;
    LinkedListManager& operator=(LinkedListManager const&) = delete;

    /// The objects in their order. A walk survives what is appended, and removing all but the object that it stands on.
    /// @{
    bool isEmpty() const { return m_list.isEmpty(); }
    unsigned int getCount() const { return m_list.getCount(); }
    Iterator begin() const { return Iterator(m_list.getFirst(), m_list); }
    Iterator end() const { return Iterator(const_cast<LinkedListElement_Untyped*>(m_list.getEnd()), m_list); }
    /// @}

    /// Takes the object over: OK, or REFUSED when it sits in a list already (it then stays the caller's).
    XCode append(T* object) { return m_list.append(UNTYPED(*object)); }
    /// Takes the object, which is in this list, over to the end of `other`.
    void moveTo(LinkedListManager& other, T& object)
    {
        m_list.unlink(UNTYPED(object));
        std::ignore = other.append(&object); // it is in no list
    }
    /// REQUIRES: the object is in this list. It is deleted.
    void remove(T& object)
    {
        m_list.unlink(UNTYPED(object));
        delete &object;
    }
    /// Deletes all objects, the first one first.
    void clear()
    {
        while (!m_list.isEmpty())
            remove(TYPED(*m_list.getFirst()));
    }

private:
    static T& TYPED(LinkedListElement_Untyped& element)
    {
        return static_cast<T&>(static_cast<LinkedListElement<T>&>(element));
    }
    static LinkedListElement_Untyped& UNTYPED(T& object) { return static_cast<LinkedListElement<T>&>(object); }

    LinkedListManager_Untyped m_list;
};
