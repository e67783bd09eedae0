#include "testing/FakeMediaContext.h"

unsigned int FakeMediaContext::s_numberOfInstances = 0;

FakeMediaContext::~FakeMediaContext() { --s_numberOfInstances; }
