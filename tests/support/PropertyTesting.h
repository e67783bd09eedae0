#pragma once

#include "platform/base/InfoContainer.h"
#include "properties/CC_Property.h"
#include "testing/FailingAllocator.h"

#include <cstddef>
#include <cstring>
#include <gtest/gtest.h>
#include <string>

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
