#include "RingRhythm.h"

RingRhythm::TypeId RingRhythm::s_typeId;

XCode DECLARE_RING_RHYTHM()
{
    if (CC_PropertyTable::FIND(RING_RHYTHM.getId()) != nullptr)
        return XCode::OK; // another line has done it
    return RING_RHYTHM.declare("Ring-Rhythm", "ring-rhythm");
}

String& RingRhythm::getValueString(String& out) const { return out.format("rhythm %u", getValue()); }
