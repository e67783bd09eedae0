#include "testing/FakeTerminationRepository.h"

#include "callcontrol/CallControl.h"

FakeTerminationRepository::FakeTerminationRepository()
{
    addReference(); // our own: counted pointers never find the last one
    CallControl::SET_MG_TERMINATION_REPOSITORY(this);
}

FakeTerminationRepository::~FakeTerminationRepository()
{
    if (CallControl::GET_MG_TERMINATION_REPOSITORY() == this)
        CallControl::SET_MG_TERMINATION_REPOSITORY(nullptr);
}
