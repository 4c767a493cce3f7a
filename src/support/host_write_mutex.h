#ifndef QUORVEX_SUPPORT_HOST_WRITE_MUTEX_H
#define QUORVEX_SUPPORT_HOST_WRITE_MUTEX_H

// The process-wide mutex that the host may hand over for recording file access. The library
// never owns it; null means no such locking.
namespace hostmutex {

void SetWriteMutex(void** mutex);
void** WriteMutex();

}  // namespace hostmutex

#endif  // QUORVEX_SUPPORT_HOST_WRITE_MUTEX_H
