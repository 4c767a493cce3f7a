#ifndef QUORVEX_QUORVEX_H
#define QUORVEX_QUORVEX_H

#include <cstdint>
#include <string>

#include "quorvex/error_codes.h"
#include "quorvex/export.h"
#include "quorvex/meta_data.h"

class CSaveMeta;
class CMetaBuffer;
class CMetaPlayer;
class CHaqAmf;
struct SDwbMetaObjectsInFrame;
namespace plat {
class CCriticalSection;
}

// Command generation of the cameras: only generation 1 changes behaviour (SetMaxResolution
// rewrites the object-detection commands for it).
enum ECameraGeneration : int32_t {
    kCameraGenerationDefault = 0,
    kCameraGenerationMod = 1,
};

// The library's facade. The host creates one instance and drives two camera slots (0 and 1)
// through it: live stream, recording, replay and analytics. Every method runs on the
// caller's thread and returns 1 on success, 1000/1001 for information, a negative code of
// EQuorvexResult on failure; no exception leaves it.
class QUORVEX_API CQuorvex {
public:
    static constexpr int kSlotCount = 2;
    static constexpr size_t kPathSize = 1020;
    static constexpr size_t kCommandSize = 260;

    CQuorvex();
    virtual ~CQuorvex();
    CQuorvex(const CQuorvex&) = delete;
    CQuorvex& operator=(const CQuorvex&) = delete;

    // Deletes every object of the slot: analytics engine, stream client, player.
    void ApiFinalize(int cam);
    // The catalogue used by recording and replay; the host keeps ownership. Null: -1001.
    int SetSaveMetaPtr(CSaveMeta* saveMeta);
    // A host-owned mutex (a pthread_mutex_t*, passed by address) that every slot's recording
    // writer holds around opening and closing data files; null for none. Process-wide.
    static void SetWriteMutex(void** mutex);
    void SetCameraGeneration(ECameraGeneration generation);
    void SetMaxResolution(int width, int height);
    // The first argument is ignored: the frame geometry is shared by both slots.
    int SetMinObjectSize(int cam, int minWidth, int frameWidth, int minHeight, int frameHeight);
    int SetMetaRetryCount(unsigned count);
    int DeleteMetaData(int cam, long from, long to);

    // Configures and opens the log: directory, maximum file size in KB, rotated files kept,
    // highest level written (1 Error .. 4 Debug). Nothing is logged before this call.
    static int MetaLoggerInitialize(const char* dir, unsigned maxSizeKB, unsigned generations,
                                    unsigned level);
    // The message of the last line that the log wrote, cut to the buffer and terminated.
    int GetLastErrMessage(char* buf, unsigned size);
    // The text of a result code; "Unknown error code." for any other value.
    static char* GetErrorDesc(int code);
    static void GetMetaApiErrMsg(int code, char* buf, unsigned size);

private:
    friend struct CQuorvexInspector;  // white-box access for the library's own tests

    void LoadIniSettings();
    void LocateIniFile();
    // Checks a slot index; logs an Error under the method's tag when it is out of range.
    static bool IsValidSlot(int cam, const char* tag);

    char m_iniPath[kPathSize];
    int32_t m_timeoutMs;
    int32_t m_socketBufSize;
    char m_getMetaCommand[kCommandSize];
    char m_getVersionCommand[kCommandSize];
    char m_getDateFormatCommand[kCommandSize];
    char m_setDmoCommand[kCommandSize];
    char m_setDsoCommand[kCommandSize];
    int32_t m_dataTimeType;
    CSaveMeta* m_pSaveMeta;
    int32_t m_deviceId;
    int32_t m_storageLocationId;
    bool m_iniCommandMode;
    CHaqAmf* m_pAmf[kSlotCount];
    plat::CCriticalSection* m_cs[kSlotCount];
    SDwbMetaObjectsInFrame* m_pHaqMeta[kSlotCount];
    CMetaBuffer* m_pMetaBuffer[kSlotCount];
    CMetaPlayer* m_pMetaPlayer[kSlotCount];
    char m_searchEndTime[32];

    int16_t m_coordScale;
    int32_t m_minObjectWidth;
    int32_t m_frameWidth;
    int32_t m_minObjectHeight;
    int32_t m_frameHeight;
    std::string m_minObjectSizeText;
    ECameraGeneration m_cameraGeneration;
};

#endif  // QUORVEX_QUORVEX_H
