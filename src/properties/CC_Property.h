#pragma once

#include "platform/base/Export.h"
#include "platform/base/InfoContainer.h"
#include "platform/base/LinkedListManager.h"
#include "platform/base/String.h"
#include "platform/base/TYRecycled.h"
#include "platform/base/XCode.h"

#include <atomic>

/// The number of a property class in this process, to be kept in a variable of the class. Nothing but asking changes
/// it.
class CC_EXPORT CC_PropertyTypeNumber
{
public:
    constexpr CC_PropertyTypeNumber() = default;
    CC_PropertyTypeNumber(CC_PropertyTypeNumber const&) = delete;
    CC_PropertyTypeNumber& operator=(CC_PropertyTypeNumber const&) = delete;

    /// The first call assigns the next free number.
    unsigned int get() { return m_number != NONE ? m_number : assign(); }

    /// What a class holds to which no number was assigned.
    static constexpr unsigned int NONE = 0xffffffff;

private:
    unsigned int assign();

    unsigned int m_number = NONE;
};

/// The number of one class, so that a class which has none cannot pass for its base.
template <class Class>
class CC_EXPORT CC_PropertyTypeId : public CC_PropertyTypeNumber
{
};

/// Counts the live properties, whatever threads own them. A base, and the first one, so that the compiler need not
/// complete half an object before it counts: that is a hundredth of a call.
class CC_EXPORT CC_PropertyCount
{
protected:
    CC_PropertyCount() noexcept { std::atomic_ref(COUNT()).fetch_add(1, std::memory_order_relaxed); }
    /// Every object counts, a copy as well; assigning changes nothing. @{
    CC_PropertyCount(CC_PropertyCount const&) noexcept : CC_PropertyCount() {}
    CC_PropertyCount& operator=(CC_PropertyCount const&) = default;
    /// @}
    ~CC_PropertyCount() { std::atomic_ref(COUNT()).fetch_sub(1, std::memory_order_relaxed); }

private:
    static unsigned int& COUNT() noexcept;
};

/// One value that the two sides of a call exchange: a number, an indicator, a state, a cause. The base of every value
/// class.
///
/// A property knows its id (CC_PropertyId), copies itself, compares itself with another of its class, prints itself and
/// may read its value from text. It is a plain value that belongs to whoever holds it, nearly always a
/// CC_PropertyContainer, which links it into its list through the two pointers that every property carries.
///
/// Value classes derive from CC_PropertyClass or CC_PropertyValue (CC_PropertyClass.h), which write down once what they
/// have in common. Constructors, setters and `getValueString` of values that need memory throw std::bad_alloc when it
/// is out; the other operations report it as they say.
///
/// Not locked: a property belongs to the thread of its owner. Type numbers are assigned lazily and unguarded, so the
/// thread that starts call control must have asked each class for its own before other threads use properties:
/// CC_Factory does so for the library's classes when it is registered, a module for its own.
///
///     CC_PropertyBoolean dataProvided(CC_PropertyId::PROVIDES_DATA, true);
///     String text;
///     dataProvided.getValueString(text); // "true"
class CC_EXPORT CC_Property : private CC_PropertyCount, public LinkedListElement<CC_Property>, public TYRecycled
{
public:
    /// The value of a class's type number as long as none was assigned.
    static constexpr unsigned int NO_TYPE_ID = CC_PropertyTypeNumber::NONE;

    /// `id`: one of CC_PropertyId, or a module's own.
    explicit CC_Property(unsigned int id) noexcept : m_id(id) {}
    /// The copy is in no list.
    CC_Property(CC_Property const& other) noexcept
        : CC_PropertyCount(other), LinkedListElement(other), TYRecycled(), m_id(other.m_id)
    {
    }
    /// Copies the id; the place in a list stays.
    CC_Property& operator=(CC_Property const& other) noexcept
    {
        m_id = other.m_id;
        return *this;
    }

    virtual ~CC_Property() = default;
    /// Takes over id and value of `other` if that is of this class or derives from it. Otherwise, and when memory is
    /// out, nothing changes (ASSIGN tells the latter). Returns this object.
    virtual CC_Property& assign(CC_Property const& other) = 0;
    /// A copy of the same class, owned by the caller; null when memory is out.
    virtual CC_Property* clone() const = 0;
    /// The number of the object's class in this process: TYPE_ID() of the class. Never to be stored or sent.
    virtual unsigned int getTypeId() const;
    /// The name of the object's class ("Boolean").
    virtual char const* getTypeName() const;
    /// Whether the object is of the class with that type number or derives from it.
    virtual bool isOfType(unsigned int typeId) const { return typeId == TYPE_ID(); }
    /// Replaces `out` by the value as text, unless a class says that it appends; returns `out`.
    virtual String& getValueString(String& out) const = 0;
    /// Reads the value from text: OK, or FAILURE with a message in `error` for a text that is none of the class's
    /// values; FAILURE as well when memory is out. The value is then unchanged. The base takes no text at all.
    virtual XCode setValueString(String& error, String const& text);
    /// Whether `other` is of this class, or derives from it, and has the same value. The ids do not matter.
    virtual bool isEqual(CC_Property const& other) const = 0;
    /// Adds one line, prefix and long name with the value; the class as well while `detail` is below `maxDetail`.
    virtual InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                   unsigned int maxDetail, unsigned int detail, String const& prefix) const;

    /// What it was made with, or has taken over since.
    unsigned int getId() const { return m_id; }
    /// The long name of the id ("Presentation-Indicator"), "(unknown)" for an id without one. Lives for ever.
    char const* getPropertyName() const;
    /// The name of the id in configuration texts ("pi"), "(unknown)" for an id without one. Lives for ever.
    char const* getPropertyShortName() const;

    /// The number of this base, of which every property is.
    static unsigned int TYPE_ID() { return s_typeId.get(); }
    /// Has `property` take over `other`, as `assign` does, and tells what that has no result for: OK, also when the
    /// classes differ; NO_ELEMENT when memory is out.
    static XCode ASSIGN(CC_Property& property, CC_Property const& other);

    /// Live properties of all classes. Counted exactly whatever threads own them; exact to read when none is at work.
    static unsigned int s_numberOfInstances;
    static CC_PropertyTypeId<CC_Property> s_typeId; ///< for `TYPE_ID()`

protected:
    /// Sets `error`, as far as memory allows, and returns FAILURE.
    static XCode REFUSE(String& error, char const* message);

    /// `property.isOfType(typeId)`, asked inside the library: g++ 12 that followed the call would name a function of
    /// the class that it has made no copy of, and the program would not link.
    static bool ASK_IS_OF_TYPE(CC_Property const& property, unsigned int typeId);

    /// Tells the innermost ASSIGN to this object, if there is one, that its `assign` lacks memory.
    void reportFailedAssignment() const noexcept;

private:
    friend class CC_PropertyTypeNumber;

    static unsigned int s_nextFreeTypeId;

    unsigned int m_id;
};

inline unsigned int& CC_PropertyCount::COUNT() noexcept { return CC_Property::s_numberOfInstances; }
