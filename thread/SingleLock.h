// A lock held for the length of a block.
#ifndef MOVIECONV_THREAD_SINGLELOCK_H
#define MOVIECONV_THREAD_SINGLELOCK_H

#include <pthread.h>

class CSingleLock {
public:
    explicit CSingleLock(pthread_mutex_t* mutex) : pMutex(mutex) { pthread_mutex_lock(pMutex); }
    virtual ~CSingleLock() { pthread_mutex_unlock(pMutex); }
    CSingleLock(const CSingleLock&) = delete;
    CSingleLock& operator=(const CSingleLock&) = delete;

private:
    pthread_mutex_t* pMutex;
};

#endif
