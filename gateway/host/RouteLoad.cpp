#include "host/RouteLoad.h"

QCause RouteLoad::admit()
{
    if (m_maxCalls != 0 && m_calls >= m_maxCalls)
        return QCause::NO_CIRCUIT_CHANNEL_AVAILABLE;
    return m_rate.take() ? QCause::NONE : QCause::SWITCHING_EQUIPMENT_CONGESTION;
}
