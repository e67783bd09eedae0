#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/LinkedListManager.h"
#include "platform/base/XCode.h"
#include "properties/CC_Property.h"
#include "properties/CC_PropertyKey.h"

#include <bit>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <new>
#include <tuple>
#include <type_traits>
#include <utility>

/// The properties of a call, a leg, an adapter or an event: owned, in the order in which they were added, at most one
/// per id. Lists are short, so look-up is a linear search. Not locked.
///
/// The operations of a module's property class may change the very container that calls them, or destroy it: what they
/// remove is not visited any more, what they add is.
///
///     CC_PropertyContainer properties;
///     if (!properties.set(Key::E164_NUMBER, "49891234").isOk())
///         ...
///     for (CC_Property const& property : properties)
///         ...
class CC_EXPORT CC_PropertyContainer
{
public:
    /// Takes every id group that exists.
    static constexpr unsigned int ALL_GROUPS = 0xff00;

    /// A position in the container; a standard forward iterator. `Property`: CC_Property, or CC_Property const.
    template <class Property>
    class BasicIterator
    {
    public:
        /// What the standard library asks of an iterator. @{
        using iterator_category = std::forward_iterator_tag;
        using value_type = CC_Property;
        using difference_type = std::ptrdiff_t;
        using pointer = Property*;
        using reference = Property&;
        /// @}

        BasicIterator() = default;
        /// A constant one from the other.
        template <class Other>
        requires(std::is_const_v<Property> && !std::is_const_v<Other>) BasicIterator(BasicIterator<Other> const& other)
            : m_position(other.m_position)
        {
        }
        /// As of a standard forward iterator. REQUIRES, but for comparing: it stands on a property. @{
        reference operator*() const { return *m_position; }
        pointer operator->() const { return &*m_position; }
        BasicIterator& operator++()
        {
            ++m_position;
            return *this;
        }
        BasicIterator operator++(int)
        {
            BasicIterator const before = *this;
            ++*this;
            return before;
        }
        friend bool operator==(BasicIterator const& left, BasicIterator const& right)
        {
            return left.m_position == right.m_position;
        }
        /// @}

    private:
        friend class CC_PropertyContainer;
        template <class>
        friend class BasicIterator;
        using Position = LinkedListManager<CC_Property>::Iterator;

        explicit BasicIterator(Position position) : m_position(position) {}

        Position m_position;
    };
    /// For walks over properties to be read, and to be changed. @{
    using ConstIterator = BasicIterator<CC_Property const>;
    using Iterator = BasicIterator<CC_Property>;
    /// @}

    CC_PropertyContainer() = default;
    /// As the assignment: what memory refuses is missing.
    CC_PropertyContainer(CC_PropertyContainer const& other) { *this = other; }
    ~CC_PropertyContainer() { interrupt(); }
    /// Replaces all properties by copies of the other's, whatever their ids. What memory refuses is missing; nothing
    /// tells so. As far as both begin with the same ids and classes of the library, and no others follow, the values
    /// are taken over where they stand.
    CC_PropertyContainer& operator=(CC_PropertyContainer const& other);

    /// The property of that id, null if there is none. It stays the container's; removing it ends it. @{
    CC_Property* get(unsigned int id);
    CC_Property const* get(unsigned int id) const;
    /// @}
    /// The same by a typed key (CC_PropertyKeys.h), none as well when it is of another class than the key's.
    template <class Property>
    CC_FoundProperty<Property> get(CC_PropertyKey<Property> key) const
    {
        return key.in(get(key.getId()));
    }
    /// The property at that position, null past the end. @{
    CC_Property* getByIndex(unsigned int index);
    CC_Property const* getByIndex(unsigned int index) const;
    /// @}
    /// The positions of `getByIndex` are those below the number. @{
    unsigned int getNumberOfProperties() const { return m_properties.getCount(); }
    bool isEmpty() const { return m_properties.isEmpty(); }
    /// @}
    /// Whether no operation of any property calls anybody (CC_PropertyKind); also false once there was another.
    bool isSelfContained() const { return m_isSelfContained; }
    /// In order. Adding properties does not disturb a walk, removing the one it stands on does. @{
    ConstIterator begin() const { return ConstIterator(m_properties.begin()); }
    ConstIterator end() const { return ConstIterator(m_properties.end()); }
    Iterator begin()
    {
        markAll();
        return Iterator(m_properties.begin());
    }
    Iterator end() { return Iterator(m_properties.end()); }
    /// @}

    /// Stores a copy: assigned to the property of that id if there is one, otherwise appended.
    ///
    /// OK, also when the stored property is of another class and keeps its value: intended, an id's class is fixed by
    /// its first owner. NO_ELEMENT when memory is out, FAILURE when the list refuses; the container is then unchanged.
    XCode set(CC_Property const& property);
    /// The same with a property made from the values: `properties.set(Key::NAME, "Ada")`.
    template <class Property, class... Values>
    requires(CC_PropertyKey<Property>::template TAKES<Values...>) XCode
        set(CC_PropertyKey<Property> key, Values&&... values)
    {
        return key.store([this](Property const& property) { return set(property); }, XCode::NO_ELEMENT,
                         std::forward<Values>(values)...);
    }
    /// Stores the other's properties whose id has a bit in common with `mask`, in order: 0x100 takes the 0x4001xx ids,
    /// 0x200 the 0x4002xx ids, 0x400 and 0x800 likewise, 0x1000 and above the 0x401xxx ids. OK, or FAILURE at the
    /// first one that is refused; those before it stay stored.
    XCode set(CC_PropertyContainer const& other, unsigned int mask);
    /// The same for all groups. A property whose id belongs to no group (bits 8 to 15 clear) is left out.
    XCode set(CC_PropertyContainer const& other) { return set(other, ALL_GROUPS); }

    /// Deletes the property of that id; whether there was one.
    bool remove(unsigned int id);
    /// Deletes the property at that position; whether there was one.
    bool removeByIndex(unsigned int index);
    /// Deletes all properties.
    void clear()
    {
        markAll();
        if (m_isSelfContained)
            m_properties.clear();
        else
            clearOfAnyKind();
    }

    /// Adds the line "Properties" and, unless this dump is already part of a container's, the properties one level
    /// below it. Returns `info`.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const;

    /// A shared container without properties, for parameters that are not used.
    static CC_PropertyContainer const& EMPTY();

private:
    // what the library does with containers of its own
    friend class CC_Call;
    friend class CC_CallAdapter;
    friend class CC_CallAdapterE164;
    friend class CC_CallLeg;
    friend class CC_PropertyBrief;
    friend class CC_PropertyFilterContainer;
    friend class CC_PropertyView;
    friend class CC_PropertyWorkingCopy;
    class Walk;
    using Position = LinkedListManager<CC_Property>::Iterator;

    /// Positions as bits, the last bit for all from there on; all of them: whatever may have changed, the ids as well.
    using Marks = std::uint16_t;
    static constexpr Marks ALL_MARKED = 0xffff;
    static constexpr Marks LAST_MARK = 0x8000;
    static constexpr Marks MARK_AT(unsigned int index)
    {
        return index < 15 ? static_cast<Marks>(1U << index) : LAST_MARK;
    }
    /// What was added, removed, stored or handed out for writing since the marks were last taken. Whoever writes in
    /// another way marks it, unless nobody takes the marks of that container.
    Marks takeMarks() { return std::exchange(m_marks, Marks{0}); }
    void mark(Marks marks) { m_marks = static_cast<Marks>(m_marks | marks); }
    void markAll() { m_marks = ALL_MARKED; }
    /// Calls `visit(ours, theirs, mark)` for the marked positions of two containers, as long as that returns true and
    /// both have the same id there; whether that was always so, and they are no more than 32. REQUIRES: they are as
    /// many.
    template <class Visit>
    bool forEachMarked(CC_PropertyContainer const& other, Marks marks, Visit const& visit) const
    {
        Position ours = m_properties.begin();
        Position theirs = other.m_properties.begin();
        unsigned int const count = m_properties.getCount();
        unsigned int index = 0;
        unsigned int rest = (marks & LAST_MARK) == 0 ? marks : marks | 0xffff0000;
        if (count > 32)
            return false; // so many are looked at in another way
        for (; rest != 0; rest &= rest - 1)
        {
            auto const next = static_cast<unsigned int>(std::countr_zero(rest));
            if (next >= count)
                return true;
            for (; index < next; ++index)
            {
                ++ours;
                ++theirs;
            }
            if (ours->getId() != theirs->getId() || !visit(*ours, *theirs, MARK_AT(index)))
                return false;
        }
        return true;
    }
    /// The mark of the property of that id, 0 if there is none.
    Marks findMark(unsigned int id) const;

    /// Ids that were met. It may say so of one that was not; nearly all others need not be looked for.
    class Met
    {
    public:
        /// From now on it was; whether it was before.
        bool meets(unsigned int id)
        {
            unsigned int const bit = 1U << INDEX(id);
            bool const isMet = (m_bits & bit) != 0;
            m_bits |= bit;
            return isMet;
        }

    private:
        /// Such that the ids which most legs have do not meet.
        static constexpr unsigned int INDEX(unsigned int id) { return (id ^ (id >> 8)) % 32; }
        unsigned int m_bits = 0;
    };

    /// Finds properties that are asked for in nearly the order in which they are stored, as they are in two containers
    /// of which one follows the other: the property behind the one found last is looked at first.
    ///
    ///     CC_PropertyContainer::Cursor seen(view);
    ///     for (CC_Property const& property : leg.getProperties())
    ///         if (CC_Property* const former = seen.find(property.getId()))
    ///             ...
    class CC_EXPORT Cursor
    {
    public:
        /// Removing properties disturbs it, adding does not.
        explicit Cursor(CC_PropertyContainer& container)
            : m_container(&container), m_next(container.m_properties.begin())
        {
        }
        /// The property of that id, null if there is none.
        CC_Property* find(unsigned int id)
        {
            if (m_next == m_container->m_properties.end() || m_next->getId() != id)
                return findElsewhere(id);
            CC_Property& found = *m_next;
            ++m_next;
            return &found;
        }

    private:
        CC_Property* findElsewhere(unsigned int id);

        CC_PropertyContainer* m_container;
        Position m_next;
    };

    /// Makes a self-contained property at the end, for who knows that there is none of its id, and marks nothing;
    /// whether memory sufficed.
    template <class Property, class... Values>
    bool append(unsigned int id, Values const&... values)
    {
        auto* const made = new (std::nothrow) Property(id, values...);
        if (made != nullptr)
            std::ignore = m_properties.append(made); // it is in no list
        return made != nullptr;
    }
    /// Tells who has called a module's class whether the container still exists, and is what it was. On the stack; one
    /// thread only. Where all are self-contained nobody watches, and nobody pays.
    class CC_EXPORT Watch
    {
    public:
        explicit Watch(CC_PropertyContainer const& container);
        ~Watch();
        Watch(Watch const&) = delete;
        Watch& operator=(Watch const&) = delete;
        bool isAlive() const { return m_container != nullptr; }

    private:
        friend class CC_PropertyContainer;
        CC_PropertyContainer const* m_container;
        Watch* m_outer;
    };
    [[gnu::cold]] void tellWatches() const;
    /// The same for who makes the container a copy of another one: it has ended, too, when somebody else began that.
    class CC_EXPORT Following
    {
    public:
        explicit Following(CC_PropertyContainer const& container);
        ~Following();
        Following(Following const&) = delete;
        Following& operator=(Following const&) = delete;
        bool isAlive() const { return m_watch.isAlive(); }

    private:
        friend class CC_PropertyContainer;
        Watch m_watch;
        Following* m_outer;
    };
    [[gnu::cold]] void tellFollowing() const;
    /// Ends what operations further out on the stack are doing here, as if it were destroyed. @{
    void interrupt() const
    {
        if (m_isWatched)
            tellWatches();
    }
    void interruptFollowing() const
    {
        if (m_isWatched)
            tellFollowing();
    }
    /// @}

    /// Whether nobody is called when the other's properties are stored here.
    bool takesUndisturbed(CC_PropertyContainer const& other) const { return !m_hasForeign && other.m_isSelfContained; }
    /// As `set(other, mask)`, but goes on after a failure: OK or the first one.
    XCode setEach(CC_PropertyContainer const& other, unsigned int mask);
    /// A copy that stays as it is, whatever happens to the other, and whether it is whole.
    [[gnu::noinline]] XCode copy(CC_PropertyContainer const& other);

    /// As `set`, for who has looked the property up, but marks nothing: `stored` is what was found by its id, null
    /// included.
    XCode replace(CC_Property* stored, CC_Property const& property);
    /// As `set`, for who follows: where that was begun by somebody else inside a clone, what is stored by then stays.
    XCode set(CC_Property const& property, Following const& self);
    /// Both have what the other had; nobody is called.
    void swap(CC_PropertyContainer& other);
    /// As `set`, but takes the properties themselves; those of no group stay behind. REQUIRES: this container is empty.
    void take(CC_PropertyContainer& other);

    CC_Property* find(unsigned int id) const;
    CC_Property* findByIndex(unsigned int index) const;

    /// As `set` for an id that is not there, but marks nothing; whether memory sufficed. REQUIRES: the property is of
    /// our own classes; who appends one that is not self-contained notes it.
    bool appendCopy(CC_Property const& property)
    {
        CC_Property* const copy = property.clone();
        if (copy != nullptr)
            std::ignore = m_properties.append(copy); // it is in no list
        return copy != nullptr;
    }
    /// Makes a copy of the other, in which at most the marked ones differ, a whole one again, and whether that was all.
    /// Otherwise anything may differ. REQUIRES: both are self-contained.
    bool takeMarked(CC_PropertyContainer const& other, Marks marks);
    /// Makes it a copy of the other; how many at the beginning are the objects that they were before. REQUIRES: as
    /// above.
    unsigned int takeOver(CC_PropertyContainer const& other);
    [[gnu::noinline]] XCode appendForeign(CC_Property const& property);
    XCode appendForeign(CC_Property const& property, Watch const& self);
    [[gnu::noinline]] void clearOfAnyKind();
    [[gnu::noinline]] XCode setDisturbed(CC_PropertyContainer const& other, unsigned int mask);
    void removeFrom(Position position);

    LinkedListManager<CC_Property> m_properties;
    bool m_isSelfContained = true;
    bool m_hasForeign : 1 = false;        // properties of a module's class, or had once
    mutable bool m_isWatched : 1 = false; // or was once
    Marks m_marks = 0;                    // with them the object is no larger than without
};
