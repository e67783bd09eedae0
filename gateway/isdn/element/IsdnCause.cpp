#include "isdn/element/IsdnCause.h"

namespace
{
constexpr int LAST = 127;

bool IS_VALUE(int value) { return value >= 1 && value <= LAST; }
} // namespace

QCause IsdnCause::FROM_WIRE(int value)
{
    return IS_VALUE(value) ? static_cast<QCause>(value) : QCause::NORMAL_UNSPECIFIED;
}

int IsdnCause::TO_WIRE(QCause cause)
{
    auto const value = static_cast<int>(cause);
    return IS_VALUE(value) ? value : static_cast<int>(QCause::NORMAL_CALL_CLEARING);
}
