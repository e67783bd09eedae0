#pragma once

#include "platform/base/TYPtr.h"
#include "platform/media/MG_IContext.h"
#include "properties/CC_PropertyClass.h"

/// The media context that a call is bound to, held by a reference. Two are equal when they hold the same object. Not
/// settable by text.
///
/// A property made without a context asks the media layer for a new one; copying one shares its context and asks
/// nothing.
///
///     call.setProperty(CC_PropertyContextId(CC_PropertyId::CONTEXT, datapathContext));
class CC_EXPORT CC_PropertyContextId : public CC_PropertyClass<CC_PropertyContextId>
{
public:
    static constexpr char const* TYPE_NAME = "ContextId";
    static TypeId s_typeId;

    /// Asks the media layer for a new context, as `setContext` does with null.
    explicit CC_PropertyContextId(unsigned int id) : CC_PropertyContextId(id, nullptr) {}
    /// As `setContext`.
    CC_PropertyContextId(unsigned int id, MG_IContext* context);

    /// Replaces `out` by the context's id, "0x" and at least eight lower-case hexadecimal digits, or by "(none)".
    String& getValueString(String& out) const override;

    /// Null while there is no context. It lives as long as the property or any other holder of a reference.
    MG_IContext* getContext() const { return m_context.get(); }
    /// Takes a reference on the context and gives up the one held before. Null asks the context repository of call
    /// control for a new one; without a repository, or when that fails, the property stays as it is.
    void setContext(MG_IContext* context);

    bool hasSameValue(CC_PropertyContextId const& other) const { return m_context == other.m_context; }

private:
    TYPtr<MG_IContext> m_context;
};
