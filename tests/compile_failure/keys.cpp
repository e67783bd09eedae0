// What a key keeps from being confused. Without a case it compiles; each case is a program that must not.
#include "adapters/CC_CallAdapter.h"
#include "properties/CC_PropertyKeys.h"

#include <tuple>

inline constexpr CC_PropertyKey<CC_PropertyUnsigned> CIRCUIT(CC_PropertyId::FIRST_OF_MODULES);

bool USE(CC_CallAdapter& adapter, CC_PropertyContainer& properties)
{
    std::ignore = adapter.setOwn(Key::NAME, "Ada");
    std::ignore = adapter.setPeer(CIRCUIT, 7);
    std::ignore = adapter.setCall(Key::CAUSE, QCause::USER_BUSY, 486);
    std::ignore = properties.set(Key::PROVIDES_DATA, true);
    String const name = adapter.getPeer(Key::NAME, "unknown");
    CC_PropertyString const* const own = adapter.getOwn(Key::NAME).get();
    bool const isUp = adapter.getPeer(Key::STATE) == CC_PropertyCallLegState::CONNECTED;

#if defined(NUMBER_FOR_TEXT)
    std::ignore = adapter.setOwn(Key::NAME, 7);
#elif defined(TEXT_FOR_TRUTH)
    std::ignore = properties.set(Key::PROVIDES_DATA, "true");
#elif defined(NUMBER_FOR_TRUTH)
    std::ignore = adapter.setPeer(Key::PROVIDES_DATA, 1);
#elif defined(NUMBER_FOR_STATE)
    std::ignore = adapter.setOwn(Key::STATE, 6);
#elif defined(ANOTHER_ENUMERATION)
    std::ignore = adapter.setCall(Key::PRESENTATION_INDICATOR, QScreeningIndicator::NETWORK_PROVIDED);
#elif defined(TEXT_FOR_MODULES_NUMBER)
    std::ignore = adapter.setOwn(CIRCUIT, "7");
#elif defined(STATE_OF_A_NAME)
    bool const isWrong = adapter.getPeer(Key::NAME) == CC_PropertyCallLegState::CONNECTED;
#elif defined(ANOTHER_CLASS)
    CC_PropertyBoolean const* const wrong = adapter.getPeer(Key::NAME).get();
#elif defined(NUMBER_AS_FALLBACK)
    String const wrong = adapter.getPeer(Key::NAME, 7);
#elif defined(TYPE_NUMBER_FROM_OUTSIDE)
    CC_PropertyString::s_typeId = 7;
#elif defined(INSIDE_OF_A_CONTAINER)
    CC_PropertyContainer::Cursor cursor(properties);
#endif
    return isUp && own != nullptr && !name.isEmpty();
}
