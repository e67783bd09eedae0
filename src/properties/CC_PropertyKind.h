#pragma once

#include "platform/base/Export.h"
#include "platform/base/XCode.h"
#include "properties/CC_Property.h"

#include <typeinfo>

/// What is known of the library's own value classes, whose operations call nothing but the library, and of classes of
/// modules that have promised the same.
///
/// Copying containers and keeping views up to date is most of what a call does, and for these classes there are ways
/// that are shorter than asking each property through its virtual operations, which nobody can tell from the long way.
/// Any other class may do anything in its operations, and may hold more than the operations that it inherits know of:
/// what is derived from one of our classes is therefore of no kind.
///
///     CC_PropertyKind const* const kind = CC_PropertyKind::OF_BOTH(stored, property);
///     if (kind != nullptr && !kind->isEqual(stored, property))
///         isComplete = kind->assign(stored, property);
class CC_EXPORT CC_PropertyKind
{
public:
    /// As the virtual operations. REQUIRES: both are of this kind.
    bool (*isEqual)(CC_Property const&, CC_Property const&);
    /// As the virtual operation, and whether memory sufficed; otherwise nothing has changed.
    bool (*assign)(CC_Property&, CC_Property const&);

    /// Whether nobody hears of an assignment or the object's end either. The media layer may hear of a context's.
    bool isSelfContained;

    /// The class's place among the library's own (CC_PropertyClasses), or NO_PLACE.
    unsigned int place;
    /// The place of a module's class.
    static constexpr unsigned int NO_PLACE = ~0U;

    /// The kind of the object's very class; null for a module's that was not declared. Any thread.
    static CC_PropertyKind const* OF(CC_Property const& property);
    /// The kind of two objects of the same class; null when the classes differ or are of no kind.
    static CC_PropertyKind const* OF_BOTH(CC_Property const& property, CC_Property const& other);

    /// Promises of a module's class (one made by CC_PropertyClass, not what derives from it) what is known of ours:
    /// when it is cloned, assigned, compared and ended, it calls nothing but itself and the library; `hasSameValue`
    /// looks at all that it holds; its code stays loaded. Legs and views that hold it are then kept up to date in the
    /// short ways, which take a part of the time. Otherwise nothing changes.
    ///
    ///     class Password : public CC_PropertyClass<Password> { ... };
    ///     CC_PropertyKind::DECLARE<Password>();
    ///
    /// At start-up, before several threads use properties. OK, also when it was declared before; REFUSED when there are
    /// too many, more than half a hundred.
    template <class Property>
    static XCode DECLARE()
    {
        return ADD(typeid(Property), OF_MODULE<Property>);
    }

    /// Gives every class its type number. Once, before several threads use properties.
    static void ASSIGN_TYPE_IDS();

private:
    template <class Property>
    static bool IS_EQUAL(CC_Property const& property, CC_Property const& other)
    {
        return static_cast<Property const&>(property).hasSameValue(static_cast<Property const&>(other));
    }
    template <class Property>
    static bool ASSIGN(CC_Property& property, CC_Property const& other)
    {
        return &property == &other || static_cast<Property&>(property).take(static_cast<Property const&>(other));
    }
    template <class Property>
    static CC_PropertyKind const THE;
    template <class Property>
    static CC_PropertyKind const OF_MODULE;

    static XCode ADD(std::type_info const& type, CC_PropertyKind const& kind);

    friend class CC_PropertyKinds;
};

template <class Property>
CC_PropertyKind const CC_PropertyKind::OF_MODULE = {&IS_EQUAL<Property>, &ASSIGN<Property>, true, NO_PLACE};
