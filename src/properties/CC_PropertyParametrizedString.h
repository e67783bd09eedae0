#pragma once

#include "platform/base/TYVector.h"
#include "properties/CC_PropertyClass.h"

/// A text with named parameters, such as user-to-user information. Not settable by text.
///
/// An update counter is part of the value, so that the same content sent twice still is a change: whoever replaces a
/// property's content passes the replaced property's counter plus one.
///
///     CC_PropertyParametrizedString::ParametrizedString content("00a1");
///     std::ignore = content.parameters.append({"encoding", "hex"});
///     CC_PropertyParametrizedString property(CC_PropertyId::USER_TO_USER_INFORMATION);
///     property.setContent(replaced != nullptr ? replaced->getUpdateCounter() + 1 : 0, content);
class CC_EXPORT CC_PropertyParametrizedString : public CC_PropertyClass<CC_PropertyParametrizedString>
{
public:
    /// One parameter.
    struct KeyValuePair
    {
        /// Any two texts. @{
        String key;
        String value;
        /// @}
        /// Case matters.
        friend bool operator==(KeyValuePair const&, KeyValuePair const&) = default;
    };

    /// A value; copying it throws std::bad_alloc when memory is out.
    struct CC_EXPORT ParametrizedString
    {
        /// What stands in front of the parameters.
        String content;
        TYVector<KeyValuePair> parameters; ///< in the order in which they were appended; a key may occur again

        ParametrizedString() = default;
        /// Without parameters. Throws std::bad_alloc when memory is out.
        explicit ParametrizedString(String const& mainText) : content(mainText) {}

        /// The value of the first parameter with that key, whatever the case of its letters; String::s_empty without
        /// one.
        String const& getParameter(String const& key) const;
        /// The same into `value`, which becomes empty without one; whether there is one.
        bool getParameter(String const& key, String& value) const;

        /// A shared instance without content, for getters that return a reference.
        static ParametrizedString const& EMPTY();

        /// Case matters in keys and values, and so does the order.
        friend bool operator==(ParametrizedString const&, ParametrizedString const&) = default;
    };

    static constexpr char const* TYPE_NAME = "Parametrized String";
    static TypeId s_typeId;

    using CC_PropertyClass::CC_PropertyClass; ///< empty, counter 0
    /// With the update counter 0. @{
    CC_PropertyParametrizedString(unsigned int id, String const& content) : CC_PropertyClass(id), m_content(content) {}
    CC_PropertyParametrizedString(unsigned int id, ParametrizedString const& content)
        : CC_PropertyClass(id), m_content(content)
    {
    }
    /// @}

    /// Replaces `out` by the content, followed by " key=value" for each parameter.
    String& getValueString(String& out) const override;

    /// What `setContent` gave last; at first the counter is 0. @{
    ParametrizedString const& getContent() const { return m_content; }
    unsigned int getUpdateCounter() const { return m_updateCounter; }
    /// @}
    /// Throws std::bad_alloc when memory is out; the value is then unchanged.
    void setContent(unsigned int counter, ParametrizedString const& content);

    bool hasSameValue(CC_PropertyParametrizedString const& other) const;

private:
    ParametrizedString m_content;
    unsigned int m_updateCounter = 0;
};
