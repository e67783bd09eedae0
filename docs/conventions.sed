# What each class of a kind states under the same name for the base that it derives from, told here once for all of them
# (sed -E; everything stays on its line).
/^ *\/\//b
s|static constexpr char const\* TYPE_NAME = |/** The name of the type or class, which `getTypeName()` gives. */ &|
s|static constexpr char const\* CONSTRAINT = |/** What follows the type in its definition: `getConstraint()`. */ &|
s|static constexpr char const\* CLASS_NAME = |/** The name of the class, which `getInfo()` appends. */ &|
s|static TypeId s_typeId;|/** The number of the class in this process, which `TYPE_ID()` gives. */ &|
s|bool hasSameValue\(CC_Property|/** Whether the values are the same, which `isEqual()` asks. */ &|
s|static unsigned int TYPE\(\);|/** The number of the class in this process, which the first call assigns. */ &|
s|static AsnEnumeratedPrimitive::Identifiers IDENTIFIERS\(\);|/** The identifiers with their numbers, all of them. */ &|
s|static char const\* NAME\(Type value\);|/** The identifier of the number, ERROR::INVALID for one that has none. */ &|
# Members of a file alone (enumerations, functions, macros) are shown and checked as those of a class are.
1s|^#pragma once|/** \\file */ &|
