#pragma once

#include "platform/base/Export.h"
#include "properties/CC_Property.h"

/// What is known of the library's own value classes, whose operations call nothing but the library.
///
/// Copying containers and keeping views up to date is most of what a call does, and for these classes there are ways
/// that are shorter than asking each property through its virtual operations, which nobody can tell from the long way.
/// A module's class may do anything in its operations, and may hold more than the operations that it inherits know of:
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

    /// The class's place among the library's own (CC_PropertyClasses).
    unsigned int place;

    /// The kind of the object's very class; null for a module's. Any thread.
    static CC_PropertyKind const* OF(CC_Property const& property);
    /// The kind of two objects of the same class; null when the classes differ or are a module's.
    static CC_PropertyKind const* OF_BOTH(CC_Property const& property, CC_Property const& other);

    /// Gives every class its type number. Once, before several threads use properties.
    static void ASSIGN_TYPE_IDS();

private:
    template <class Property>
    static CC_PropertyKind const THE;

    friend class CC_PropertyKinds;
};
