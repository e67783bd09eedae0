#include "platform/base/TYMutex.h"

TYMutex::TYMutex(unsigned int recursive)
{
    pthread_mutexattr_t attributes;
    pthread_mutexattr_init(&attributes);
    pthread_mutexattr_settype(&attributes, recursive != 0 ? PTHREAD_MUTEX_RECURSIVE : PTHREAD_MUTEX_DEFAULT);
    pthread_mutex_init(&m_mutex, &attributes);
    pthread_mutexattr_destroy(&attributes);
}

TYMutex::~TYMutex() { pthread_mutex_destroy(&m_mutex); }

void TYMutex::lock() { pthread_mutex_lock(&m_mutex); }

void TYMutex::unlock() { pthread_mutex_unlock(&m_mutex); }
