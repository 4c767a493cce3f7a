#ifndef QUORVEX_META_DATA_H
#define QUORVEX_META_DATA_H

#include <cstdint>

// One frame of camera metadata as the host sees it. The data belongs to the library (the
// slot's ring buffer or the player's read buffer) and stays valid until the next call that
// reads a frame of the same slot.
struct META_DATA {
    int32_t m_camTime;     // camera time of the frame, seconds since 1970 (0: unknown)
    uint32_t m_timeStamp;  // the frame's "TimStamp:" value (0: missing)
    int32_t m_recvTime;    // host clock when the frame header was parsed, seconds since 1970
    int32_t m_dataSize;    // bytes of binary metadata
    unsigned char* m_pData;
};

// The host callback: slot, user pointer, frame or null, status (1 for a frame, else an error
// code), event text or null, second text or null, true when the frame changed the grid scale.
// Called on the slot's worker thread; it must return quickly and must not stop or finalize
// its own slot.
extern "C" typedef void (*MetaCallback)(int cam, void* user, META_DATA* frame, int status,
                                        const char* text, const char* text2, bool gridChanged);

#endif  // QUORVEX_META_DATA_H
