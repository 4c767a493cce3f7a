#include "quorvex/quorvex.h"

#include <cstdio>
#include <cstring>
#include <new>

#include "analytics/haq_amf.h"
#include "facade/error_table.h"
#include "facade/ini_profile.h"
#include "platform/critical_section.h"
#include "stream/meta_buffer.h"
#include "support/host_write_mutex.h"
#include "support/meta_file_logger.h"
#include "support/utf8_path.h"

namespace {

constexpr const char* kIniSection = "MetaBuffer";
constexpr const char* kIniFileName = "Quorvex.ini";

constexpr int kDefaultSocketBufSize = 8192;
constexpr int kDefaultDataTimeType = 0;
constexpr const char* kDefaultGetMetaCommand =
    "/metadata.cgi?format=binary&package=obj&time=on&ptzpos=on&sinterval=";
constexpr const char* kDefaultGetVersionCommand = "/command/inquiry.cgi?inq=metadata";
constexpr const char* kDefaultGetDateFormatCommand = "/command/inquiry.cgi?inq=system";
constexpr const char* kDefaultSetDmoCommand =
    "/command/objectdetection.cgi?PositionMode=current&Od99Mode=mod&Od99Win1=on&Od99Win1Area=1,"
    "1,639,479&Od99Win1Mode=det&Od99MaxObjectSize=639,479&Od99MinObjectSize=";
constexpr const char* kDefaultSetDsoCommand =
    "/command/objectdetection.cgi?PositionMode=current&Od99Mode=uod&Od99Win1=on&Od99Win1Area=1,"
    "1,639,479&Od99Win1Mode=det&DetectionTime=000040&ReleaseTime=025959&Od99MaxObjectSize=639,"
    "479&Od99MinObjectSize=";

}  // namespace

CQuorvex::CQuorvex()
    : m_timeoutMs(0),
      m_socketBufSize(0),
      m_dataTimeType(0),
      m_pSaveMeta(nullptr),
      m_deviceId(0),
      m_storageLocationId(0),
      m_iniCommandMode(true),
      m_coordScale(2),
      m_minObjectWidth(8),
      m_frameWidth(320),
      m_minObjectHeight(8),
      m_frameHeight(240),
      m_cameraGeneration(kCameraGenerationDefault) {
    m_iniPath[0] = '\0';
    m_getMetaCommand[0] = '\0';
    m_getVersionCommand[0] = '\0';
    m_getDateFormatCommand[0] = '\0';
    m_setDmoCommand[0] = '\0';
    m_setDsoCommand[0] = '\0';
    m_searchEndTime[0] = '\0';
    for (int cam = 0; cam < kSlotCount; ++cam) {
        m_pAmf[cam] = nullptr;
        m_pHaqMeta[cam] = nullptr;
        m_pMetaBuffer[cam] = nullptr;
        m_pMetaPlayer[cam] = nullptr;
        m_cs[cam] = nullptr;
    }
    LocateIniFile();
    LoadIniSettings();
    for (int cam = 0; cam < kSlotCount; ++cam) {
        m_cs[cam] = new (std::nothrow) plat::CCriticalSection();
    }
    // Analytics buffers of the slots are allocated here once the engine set-up exists.
}

CQuorvex::~CQuorvex() {
    for (int cam = 0; cam < kSlotCount; ++cam) {
        ApiFinalize(cam);
        delete m_cs[cam];
        m_cs[cam] = nullptr;
    }
}

void CQuorvex::LocateIniFile() {
    std::string folder = utf8path::ExecutableFolder();
    std::string path;
    if (!folder.empty()) {
        path = folder + kIniFileName;
    }
    if (path.empty() || path.size() >= sizeof(m_iniPath)) {
        path = std::string(".") + utf8path::kPathSeparator + kIniFileName;
    }
    std::snprintf(m_iniPath, sizeof(m_iniPath), "%s", path.c_str());
}

void CQuorvex::LoadIniSettings() {
    m_socketBufSize = CIniProfile::GetMyProfileInt(kIniSection, "SocketBufSize",
                                                   kDefaultSocketBufSize, m_iniPath);
    struct STextKey {
        const char* key;
        const char* def;
        char* member;
    };
    const STextKey keys[] = {
        {"GetMetaCommand", kDefaultGetMetaCommand, m_getMetaCommand},
        {"GetVersionCommand", kDefaultGetVersionCommand, m_getVersionCommand},
        {"GetDateFormatCommand", kDefaultGetDateFormatCommand, m_getDateFormatCommand},
        {"SetDmoCommand", kDefaultSetDmoCommand, m_setDmoCommand},
        {"SetDsoCommand", kDefaultSetDsoCommand, m_setDsoCommand},
    };
    for (const STextKey& k : keys) {
        unsigned long len = CIniProfile::GetMyProfileString(kIniSection, k.key, k.def, k.member,
                                                            kCommandSize, m_iniPath);
        // A value that filled the whole buffer may have been cut: the default is safer.
        if (len == kCommandSize - 1) {
            std::snprintf(k.member, kCommandSize, "%s", k.def);
        }
    }
    m_dataTimeType =
        CIniProfile::GetMyProfileInt(kIniSection, "DataTimeType", kDefaultDataTimeType, m_iniPath);
}

bool CQuorvex::IsValidSlot(int cam, const char* tag) {
    if (cam >= 0 && cam < kSlotCount) {
        return true;
    }
    CMetaFileLogger::Instance().Print(kLogError, tag, "Invalid camera index %d.", cam);
    return false;
}

void CQuorvex::ApiFinalize(int cam) {
    if (!IsValidSlot(cam, "CQuorvex::ApiFinalize")) {
        return;
    }
    delete m_pAmf[cam];
    m_pAmf[cam] = nullptr;
    // The stream client and the player of the slot are finalized here once the live and
    // replay interfaces create them.
}

int CQuorvex::SetSaveMetaPtr(CSaveMeta* saveMeta) {
    if (saveMeta == nullptr) {
        CMetaFileLogger::Instance().Print(kLogError, "CQuorvex::SetSaveMetaPtr", "Null ptr.");
        return QVX_ERR_INVALID_PARAMETERS;
    }
    m_pSaveMeta = saveMeta;
    return QVX_OK;
}

void CQuorvex::SetWriteMutex(void** mutex) {
    hostmutex::SetWriteMutex(mutex);
}

void CQuorvex::SetCameraGeneration(ECameraGeneration generation) {
    m_cameraGeneration = generation;
}

void CQuorvex::SetMaxResolution(int width, int height) {
    if (m_cameraGeneration != kCameraGenerationMod) {
        return;
    }
    const int w = width - 1;
    const int h = height - 1;
    char command[kCommandSize];
    std::snprintf(command, sizeof(command),
                  "/command/objectdetection.cgi?MODThreshold=30&DetectionResponse=5&DetAreaWin1=1,"
                  "1,%d,1,%d,%d,1,%d&MODMaxObjectSize=%d,%d&MODMinObjectSize=",
                  w, w, h, h, w, h);
    std::memcpy(m_setDmoCommand, command, sizeof(command));
    std::memcpy(m_setDsoCommand, command, sizeof(command));
}

int CQuorvex::SetMinObjectSize(int /*cam*/, int minWidth, int frameWidth, int minHeight,
                               int frameHeight) {
    m_minObjectWidth = minWidth;
    m_frameWidth = frameWidth;
    m_minObjectHeight = minHeight;
    m_frameHeight = frameHeight;
    return QVX_OK;
}

int CQuorvex::SetMetaRetryCount(unsigned count) {
    // Only slot 0's stream client takes a retry count; without one there is nothing to set.
    if (m_pMetaBuffer[0] == nullptr) {
        return QVX_OK;
    }
    return m_pMetaBuffer[0]->SetRetryCount(static_cast<uint16_t>(count & 0xFFFFu));
}

int CQuorvex::DeleteMetaData(int /*cam*/, long /*from*/, long /*to*/) {
    return -1;
}

int CQuorvex::MetaLoggerInitialize(const char* dir, unsigned maxSizeKB, unsigned generations,
                                   unsigned level) {
    CMetaFileLogger& log = CMetaFileLogger::Instance();
    int rc = log.Configure(dir, maxSizeKB, generations, level);
    if (rc != 1) {
        return rc;
    }
    log.Print(kLogInfo, "CQuorvex()", "Log initialized.");
    return QVX_OK;
}

int CQuorvex::GetLastErrMessage(char* buf, unsigned size) {
    CMetaFileLogger::Instance().GetLastLine(buf, size);
    return QVX_OK;
}

char* CQuorvex::GetErrorDesc(int code) {
    return ErrorTextOf(code);
}

void CQuorvex::GetMetaApiErrMsg(int code, char* buf, unsigned size) {
    if (buf == nullptr || size == 0) {
        return;
    }
    std::snprintf(buf, size, "%s", ErrorTextOf(code));
}
