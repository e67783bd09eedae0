#pragma once

#include "platform/base/TYMutex.h"

#include <utility>

/// A counted pointer: holds one reference on an object that has `addReference()` and `removeReference()`.
///
/// The pointer is replaced before the old reference is given up, so an object whose end calls back never finds itself.
template <class T>
class TYPtr
{
public:
    TYPtr() = default;
    /// Takes a reference on the object; null: none.
    explicit TYPtr(T* object) : m_object(object)
    {
        if (m_object != nullptr)
            m_object->addReference();
    }
    /// A copy takes a reference of its own; what is moved from holds none afterwards. @{
    TYPtr(TYPtr const& other) : TYPtr(other.m_object) {}
    TYPtr(TYPtr&& other) noexcept : m_object(std::exchange(other.m_object, nullptr)) {}
    ~TYPtr() { set(nullptr); }
    TYPtr& operator=(TYPtr const& other)
    {
        set(other.m_object);
        return *this;
    }
    TYPtr& operator=(TYPtr&& other) noexcept
    {
        TYPtr taken(std::move(other));
        std::swap(m_object, taken.m_object);
        return *this;
    }
    /// @}

    /// Takes a reference on `object` (null: none) and gives up the one held before. The same object: nothing happens.
    void set(T* object)
    {
        if (object == m_object)
            return;
        if (object != nullptr)
            object->addReference();
        T* const old = std::exchange(m_object, object);
        if (old != nullptr)
            old->removeReference();
    }

    /// The object, null when it holds none; two are equal that hold the same. REQUIRES, in -> and *: it holds one. @{
    T* get() const { return m_object; }
    T* operator->() const { return m_object; }
    T& operator*() const { return *m_object; }
    explicit operator bool() const { return m_object != nullptr; }
    friend bool operator==(TYPtr const& left, TYPtr const& right) { return left.m_object == right.m_object; }
    /// @}

private:
    T* m_object = nullptr;
};

template <class T>
class TYLockPtr;

/// A counted pointer with a lock of its own, for an interface that several threads reach: use it through a TYLockPtr.
template <class T>
class TYPPtr
{
public:
    TYPPtr() = default;
    /// Holds the object that the other holds at this moment.
    TYPPtr(TYPPtr const& other) : m_pointer(other.copy()) {}
    TYPPtr& operator=(TYPPtr const&) = delete;

    /// As `TYPtr::set`, under the lock; the old reference is given up after it.
    void set(T* object)
    {
        TYPtr<T> replaced(object); // given up after the lock
        TYAutoLock<TYMutex> const lock(m_mutex);
        std::swap(m_pointer, replaced);
    }
    /// Whether it held none at this moment; another thread may change that at once.
    bool isEmpty() const { return !copy(); }

private:
    friend class TYLockPtr<T>;
    TYPtr<T> copy() const
    {
        TYAutoLock<TYMutex> const lock(m_mutex);
        return m_pointer;
    }

    TYPtr<T> m_pointer;
    mutable TYMutex m_mutex{1};
};

/// The use of a TYPPtr's object, under its lock.
///
///     TYLockPtr<IRebootMgmt> rebootMgmt(m_rebootMgmt);
///     rebootMgmt.lock()->releaseGracefulLock("owner");
///     rebootMgmt.unlock();
template <class T>
class TYLockPtr
{
public:
    /// REQUIRES: the holder outlives it. Nothing is locked yet.
    explicit TYLockPtr(TYPPtr<T>& holder) : m_holder(holder) {}
    ~TYLockPtr() { unlock(); }
    TYLockPtr(TYLockPtr const&) = delete;
    TYLockPtr& operator=(TYLockPtr const&) = delete;

    /// Locks the holder and returns its object, null when it holds none.
    T* lock()
    {
        if (!std::exchange(m_isLocked, true))
            m_holder.m_mutex.lock();
        return m_holder.m_pointer.get();
    }
    /// Gives the lock up, if it is held; the object is then not to be used any more.
    void unlock()
    {
        if (std::exchange(m_isLocked, false))
            m_holder.m_mutex.unlock();
    }

private:
    TYPPtr<T>& m_holder;
    bool m_isLocked = false;
};
