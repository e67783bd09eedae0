#pragma once

#include "platform/base/InfoContainer.h"
#include "properties/CC_Property.h"
#include "testing/FailingAllocator.h"

#include <cstddef>
#include <cstring>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <new>
#include <string>
#include <utility>

// What the tests of the properties share.

/// The value's text. What stood in the string before is replaced.
inline std::string VALUE_OF(CC_Property const& property)
{
    String text("left from before");
    return property.getValueString(text).c_str();
}

/// The message with which the property refuses the text; its value must stay.
inline std::string REFUSAL_OF(CC_Property& property, String const& text)
{
    std::string const before = VALUE_OF(property);
    String error;
    EXPECT_EQ(XCode::FAILURE, property.setValueString(error, text));
    EXPECT_EQ(before, VALUE_OF(property));
    return error.c_str();
}

/// The object's dump with its own line at level 0, detail 0.
template <class Object>
std::string DUMP(Object const& object, unsigned int maxLevel, unsigned int maxDetail, char const* prefix = "")
{
    InfoContainer info;
    EXPECT_EQ(&info, &object.getInfo(info, maxLevel, 0, maxDetail, 0, prefix));
    return info.getString_TreeFormat().c_str();
}

/// Runs `operation` with its first, second, third ... allocation failing until none is left to fail, and after each
/// failure `check`. Returns the number of failures.
template <class Operation, class Check>
unsigned long WITH_EACH_ALLOCATION_FAILING(Operation const& operation, Check const& check)
{
    for (unsigned long n = 1;; ++n)
    {
        FailingAllocator::failNth(n);
        operation();
        FailingAllocator::stop();
        if (!FailingAllocator::hasFailed())
            return n - 1;
        check();
    }
}

/// The place of a virtual operation in the table of its class, counted from 0.
template <class Operation>
std::size_t SLOT_OF(Operation operation)
{
    std::size_t parts[2]; // the offset in the table plus one, and the adjustment of the object's address
    static_assert(sizeof operation == sizeof parts);
    std::memcpy(parts, &operation, sizeof parts);
    return (parts[0] - 1) / sizeof(void*);
}

/// A module's property of a number, written without the library's help, that does what the test says when it is asked
/// for something: each deed once. It shares them with its copies.
class ActingProperty : public CC_Property
{
public:
    using Deed = std::function<void()>;
    struct Deeds
    {
        Deed onClone, onAssign, onIsEqual, onText, onEnd;
        unsigned int numberOfClones = 0;
        bool isClonable = true;
    };

    ActingProperty(unsigned int id, int value, std::shared_ptr<Deeds> deeds)
        : CC_Property(id), m_value(value), m_deeds(std::move(deeds))
    {
    }
    ActingProperty(ActingProperty const&) = default;
    ~ActingProperty() override { ACT(m_deeds->onEnd); }

    int getNumber() const { return m_value; }
    CC_Property& assign(CC_Property const& other) override
    {
        if (auto const* const same = dynamic_cast<ActingProperty const*>(&other))
        {
            CC_Property::operator=(other);
            m_value = same->m_value;
        }
        ACT(m_deeds->onAssign);
        return *this;
    }
    CC_Property* clone() const override
    {
        ++m_deeds->numberOfClones;
        CC_Property* const copy = m_deeds->isClonable ? new (std::nothrow) ActingProperty(*this) : nullptr;
        ACT(m_deeds->onClone);
        return copy;
    }
    String& getValueString(String& out) const override
    {
        out.format("%d", m_value);
        ACT(m_deeds->onText);
        return out;
    }
    bool isEqual(CC_Property const& other) const override
    {
        auto const* const same = dynamic_cast<ActingProperty const*>(&other);
        bool const isSame = same != nullptr && same->m_value == m_value;
        ACT(m_deeds->onIsEqual);
        return isSame;
    }

private:
    /// What the deed may end is not touched: neither the property nor, unless others hold them, its deeds.
    static void ACT(Deed& deed)
    {
        if (Deed const once = std::exchange(deed, nullptr))
            once();
    }

    int m_value;
    std::shared_ptr<Deeds> m_deeds;
};
