#include "stream/meta_buffer.h"

#include <cerrno>
#include <cstdio>
#include <cstring>
#include <new>
#include <string_view>

#include "platform/clock.h"
#include "quorvex/error_codes.h"
#include "stream/base64.h"
#include "support/meta_file_logger.h"

namespace {

constexpr const char* kTagConnect = "CMetaBuffer::Connect";
constexpr const char* kTagRecv = "recv_n";
constexpr const char* kTagRequest = "CMetaBuffer::RequestCGI";
constexpr const char* kTagInfo = "CMetaBuffer::GetCameraInfo";
constexpr const char* kTagInitialize = "CMetaBuffer::Initialize";
constexpr const char* kTagQueue = "CMetaBuffer::QueueCommand";
// The longest single wait while a connection is pending, so that a stop is noticed.
constexpr uint32_t kConnectPollMs = 1000;

CMetaFileLogger& Log() {
    return CMetaFileLogger::Instance();
}

// Copies a text that must fit whole; false (and an empty field) when it does not.
bool CopyWhole(char* field, size_t size, const char* text) {
    int n = std::snprintf(field, size, "%s", text == nullptr ? "" : text);
    if (n < 0 || static_cast<size_t>(n) >= size) {
        field[0] = '\0';
        return false;
    }
    return true;
}

}  // namespace

CMetaBuffer::CMetaBuffer() = default;

CMetaBuffer::~CMetaBuffer() {
    CloseSocket();
}

int CMetaBuffer::InitializeTransport(const char* deviceName, const char* host, uint16_t port,
                                     uint32_t timeoutMs, const char* streamPath, const char* user,
                                     const char* password, MetaCallback callback, int cameraIndex,
                                     void* context, const char* commandPrefix) {
    int result = InitializeRequest(deviceName, commandPrefix, streamPath, user, password);
    if (result != QVX_OK) {
        return result;
    }
    return InitializePeer(host, port, timeoutMs, callback, cameraIndex, context);
}

int CMetaBuffer::InitializeRequest(const char* deviceName, const char* commandPrefix,
                                   const char* streamPath, const char* user, const char* password) {
    // A long display name only shortens the log lines.
    std::snprintf(m_deviceName, sizeof(m_deviceName), "%s",
                  deviceName == nullptr ? "" : deviceName);
    Log().Print(kLogDebug, kTagInitialize, "[%s] Enter MetaBuffer Initialize.", m_deviceName);
    // A cut prefix would send every command to the wrong place.
    if (!CopyWhole(m_commandPrefix, sizeof(m_commandPrefix), commandPrefix)) {
        Log().Print(kLogError, kTagInitialize, "[%s] Command prefix too long.", m_deviceName);
        return QVX_ERR_INVALID_PARAMETERS;
    }
    std::string request;
    if (!BuildBasicRequest(kTagInitialize, streamPath, user, password, &request)) {
        return QVX_ERR_INVALID_PARAMETERS;
    }
    // The Basic line ends in one CRLF; the stream request ends in three.
    m_streamRequest = request + "\r\n\r\n";
    m_streamPath = streamPath == nullptr ? "" : streamPath;
    m_user = user == nullptr ? "" : user;
    m_password = password == nullptr ? "" : password;
    return QVX_OK;
}

int CMetaBuffer::InitializePeer(const char* host, uint16_t port, uint32_t timeoutMs,
                                MetaCallback callback, int cameraIndex, void* context) {
    uint32_t address = 0;
    if (!CopyWhole(m_host, sizeof(m_host), host) || !plat::ResolveIpv4(m_host, &address)) {
        Log().Print(kLogError, kTagInitialize, "[%s] Fail to get addrinfo for %s.", m_deviceName,
                    host == nullptr ? "" : host);
        return QVX_ERR_UNKNOWN_HOST;
    }
    m_port = port;
    m_peer.address = address;
    m_peer.port = port;
    m_callback = callback;
    m_cameraIndex = cameraIndex;
    m_context = context;
    m_timeoutMs = timeoutMs;
    return QVX_OK;
}

bool CMetaBuffer::BuildBasicRequest(const char* tag, const char* path, const char* user,
                                    const char* password, std::string* request) {
    char credentials[kCredentialsSize];
    char encoded[kBase64Size];
    int n = std::snprintf(credentials, sizeof(credentials), "%s:%s", user == nullptr ? "" : user,
                          password == nullptr ? "" : password);
    if (n < 0 || static_cast<size_t>(n) >= sizeof(credentials) ||
        !Base64Encode(credentials, encoded, sizeof(encoded))) {
        Log().Print(kLogError, tag, "[%s] Credentials too long.", m_deviceName);
        return false;
    }
    char line[kRequestSize];
    n = std::snprintf(line, sizeof(line), "GET %s HTTP/1.0\r\nAuthorization: Basic %s\r\n",
                      path == nullptr ? "" : path, encoded);
    // Room is kept for the blank line that ends every request.
    if (n < 0 || static_cast<size_t>(n) + 4 >= sizeof(line)) {
        Log().Print(kLogError, tag, "[%s] Request too long.", m_deviceName);
        return false;
    }
    request->assign(line, static_cast<size_t>(n));
    return true;
}

void CMetaBuffer::SetInquiryPaths(const char* dateFormatPath, const char* versionPath) {
    m_pDateFormatPath = dateFormatPath;
    m_pVersionPath = versionPath;
}

void CMetaBuffer::SetDigestCredentials(const char* user, const char* password) {
    m_digestUser = user == nullptr ? "" : user;
    m_digestPassword = password == nullptr ? "" : password;
}

int CMetaBuffer::MonitorState() {
    plat::CScopedLock lock(m_stateLock);
    return m_monitorState;
}

void CMetaBuffer::SetMonitorState(int state) {
    plat::CScopedLock lock(m_stateLock);
    m_monitorState = state;
}

int CMetaBuffer::LastError() {
    plat::CScopedLock lock(m_errorLock);
    return m_lastError;
}

void CMetaBuffer::SetLastError(int error) {
    plat::CScopedLock lock(m_errorLock);
    m_lastError = error;
}

void CMetaBuffer::Notify(int code, const char* text) {
    if (m_callback != nullptr) {
        m_callback(m_cameraIndex, m_context, nullptr, code, text, nullptr, false);
    }
}

plat::SocketHandle CMetaBuffer::Connect(uint32_t timeoutMs) {
    plat::SocketHandle s = plat::SocketCreateTcp();
    if (s == plat::kInvalidSocket) {
        SetLastError(plat::SocketLastError());
        Log().Print(kLogError, kTagConnect, "socket err: %d", LastError());
        return plat::kInvalidSocket;
    }
    if (!plat::SocketSetNonBlocking(s, true)) {
        SetLastError(plat::SocketLastError());
        Log().Print(kLogError, kTagConnect, "fcntl/ioctlsocket err: %d", LastError());
        CloseSocket(s);
        return plat::kInvalidSocket;
    }
    int rc = plat::SocketConnect(s, m_peer);
    if (rc < 0) {
        SetLastError(plat::SocketLastError());
        Log().Print(kLogError, kTagConnect, "connect err: %d", LastError());
        CloseSocket(s);
        return plat::kInvalidSocket;
    }
    if (rc == 1) {
        const uint32_t start = plat::TickCount();
        for (;;) {
            const uint32_t elapsed = plat::TickCount() - start;
            if (elapsed >= timeoutMs) {
                Log().Print(kLogError, kTagConnect, "connection timeout error");
                CloseSocket(s);
                return plat::kInvalidSocket;
            }
            if (MonitorState() != kMonitoring) {
                Log().Print(kLogError, kTagConnect, "break connection");
                CloseSocket(s);
                return plat::kInvalidSocket;
            }
            const uint32_t remaining = timeoutMs - elapsed;
            int ready = plat::SocketWaitWritable(
                s, remaining < kConnectPollMs ? remaining : kConnectPollMs);
            if (ready < 0) {
                SetLastError(plat::SocketLastError());
                Log().Print(kLogError, kTagConnect, "select err: %d", LastError());
                CloseSocket(s);
                return plat::kInvalidSocket;
            }
            if (ready > 0) {
                break;
            }
        }
        // Writable also means a refused or failed attempt; only the outcome tells.
        int outcome = plat::SocketConnectResult(s);
        if (outcome != 0) {
            SetLastError(outcome);
            Log().Print(kLogError, kTagConnect, "connect err: %d", outcome);
            CloseSocket(s);
            return plat::kInvalidSocket;
        }
    }
    if (!plat::SocketSetRecvBuffer(s, 0)) {
        SetLastError(plat::SocketLastError());
        Log().Print(kLogError, kTagConnect, "setsockopt err: %d", LastError());
        CloseSocket(s);
        return plat::kInvalidSocket;
    }
    return s;
}

long CMetaBuffer::recv_n(uint32_t timeoutMs, plat::SocketHandle s, char* buf, long len, int flags) {
    if (len < 1) {
        return 0;
    }
    long received = 0;
    while (received < len) {
        int ready = plat::SocketWaitReadable(s, timeoutMs);
        if (ready < 0) {
            Log().Print(kLogError, kTagRecv, "select error: %d.", plat::SocketLastError());
            return -1;
        }
        if (ready == 0) {
            Log().Print(kLogError, kTagRecv, "select timeout.");
            return -1;
        }
        long n = plat::SocketRecv(s, buf + received, static_cast<size_t>(len - received), flags);
        if (n < 0) {
            return n;
        }
        if (n == 0) {
            break;
        }
        received += n;
    }
    return received;
}

long CMetaBuffer::SendAll(plat::SocketHandle s, const char* buf, long len) {
    long sent = 0;
    while (sent < len) {
        long n = plat::SocketSend(s, buf + sent, static_cast<size_t>(len - sent));
        if (n < 1) {
            break;
        }
        sent += n;
    }
    return sent;
}

void CMetaBuffer::CloseSocket(plat::SocketHandle& s) {
    if (s != plat::kInvalidSocket) {
        plat::SocketShutdownBoth(s);
        plat::SocketClose(s);
        s = plat::kInvalidSocket;
    }
}

void CMetaBuffer::CloseSocket() {
    CloseSocket(m_socket);
}

bool CMetaBuffer::Base64Encode(const char* text, char* out, size_t outSize) {
    if (text == nullptr) {
        text = "";
    }
    return base64::Encode(text, std::strlen(text), out, outSize);
}

int CMetaBuffer::ExchangeCgi(uint32_t timeoutMs, const char* path, const char* user,
                             const char* password, std::vector<char>* answer,
                             cgi::SResponse* parsed) {
    answer->clear();
    if (path == nullptr) {
        Log().Print(kLogError, kTagRequest, "[%s] Null path.", m_deviceName);
        return QVX_ERR_INVALID_PARAMETERS;
    }
    std::string request;
    // Checked before connecting: a request that cannot be built is not worth a connection.
    if (!BuildBasicRequest(kTagRequest, path, user, password, &request)) {
        return QVX_ERR_INVALID_PARAMETERS;
    }
    request += "\r\n";

    plat::SocketHandle s = Connect(timeoutMs);
    if (s == plat::kInvalidSocket) {
        Log().Print(kLogError, kTagRequest, "[%s] Connect error.", m_deviceName);
        Notify(QVX_ERR_TIMEOUT, "Connection Timeout");
        return QVX_ERR_TIMEOUT;
    }
    const long length = static_cast<long>(request.size());
    if (SendAll(s, request.data(), length) < length) {
        SetLastError(plat::SocketLastError());
        CloseSocket(s);
        Log().Print(kLogError, kTagRequest, "[%s] Send error.", m_deviceName);
        Notify(QVX_ERR_WINSOCK, "Send Failed");
        return -1;
    }

    char chunk[kReceiveChunk];
    for (;;) {
        long n = recv_n(timeoutMs, s, chunk, kReceiveChunk, 0);
        if (n < 0) {
            SetLastError(plat::SocketLastError());
            CloseSocket(s);
            Log().Print(kLogError, kTagRequest, "[%s] Receive error.", m_deviceName);
            Notify(QVX_ERR_WINSOCK, "Recv Failed");
            return -1;
        }
        if (answer->size() + static_cast<size_t>(n) > kMaxResponseBytes) {
            CloseSocket(s);
            answer->clear();
            Log().Print(kLogError, kTagRequest, "[%s] Response too large.", m_deviceName);
            Notify(QVX_ERR_UNEXPECTED_DATA, "Unexpected Data Received");
            return QVX_ERR_UNEXPECTED_DATA;
        }
        answer->insert(answer->end(), chunk, chunk + n);
        if (n < kReceiveChunk) {
            break;
        }
    }
    CloseSocket(s);

    cgi::ParseResponse(std::string_view(answer->data(), answer->size()), parsed);
    switch (parsed->outcome) {
        case cgi::EOutcome::kOk:
            return QVX_OK;
        case cgi::EOutcome::kHttpError: {
            Log().Print(kLogError, kTagRequest, "[%s] HTTP error:%s.", m_deviceName,
                        parsed->status);
            const int result = cgi::StatusResult(*parsed);
            std::string text = std::string("HTTP error:") + parsed->status;
            if (result == QVX_ERR_SERVICE_UNAVAILABLE) {
                text = "Service Unavailable Error";
            }
            // A status outside 4xx and 5xx is reported without becoming the last error.
            if (result != QVX_ERR_HTTP) {
                SetLastError(result);
            }
            Notify(result, text.c_str());
            return result;
        }
        case cgi::EOutcome::kIllegalContentLength:
            Log().Print(kLogError, kTagRequest, "[%s] Illegal Content-Length.", m_deviceName);
            Notify(QVX_ERR_UNEXPECTED_DATA, "Illegal Content-Length");
            return QVX_ERR_UNEXPECTED_DATA;
        case cgi::EOutcome::kNoSeparator:
            Log().Print(kLogError, kTagRequest, "[%s] Not found data seperater.", m_deviceName);
            Notify(QVX_ERR_UNEXPECTED_DATA, "Not found data seperater");
            return QVX_ERR_UNEXPECTED_DATA;
        case cgi::EOutcome::kLengthMismatch:
            Log().Print(kLogError, kTagRequest, "[%s] Content-Length not match.", m_deviceName);
            Notify(QVX_ERR_UNEXPECTED_DATA, "Content-Length not match");
            return QVX_ERR_UNEXPECTED_DATA;
    }
    return QVX_ERR_UNEXPECTED_DATA;
}

int CMetaBuffer::RequestCGI(uint32_t timeoutMs, const char* path, const char* user,
                            const char* password, char** response, unsigned* length) {
    if (response == nullptr) {
        Log().Print(kLogError, kTagRequest, "[%s] Null response pointer.", m_deviceName);
        return QVX_ERR_INVALID_PARAMETERS;
    }
    *response = nullptr;
    std::vector<char> answer;
    cgi::SResponse parsed;
    const int result = ExchangeCgi(timeoutMs, path, user, password, &answer, &parsed);
    if (answer.empty() && result != QVX_OK) {
        return result;
    }
    char* buffer = new (std::nothrow) char[answer.size() + 1];
    if (buffer == nullptr) {
        Log().Print(kLogError, kTagRequest, "[%s] Response alloc err: %d.", m_deviceName, ENOMEM);
        Notify(QVX_ERR_MEMORY_ALLOCATION, "Memory error");
        return QVX_ERR_MEMORY_ALLOCATION;
    }
    std::memcpy(buffer, answer.data(), answer.size());
    buffer[answer.size()] = '\0';
    *response = buffer;
    if (result != QVX_OK) {
        return result;
    }
    if (parsed.contentLength > 0) {
        std::memmove(buffer, buffer + parsed.bodyOffset, parsed.contentLength);
    }
    if (length != nullptr) {
        *length = static_cast<unsigned>(parsed.contentLength);
    }
    return QVX_OK;
}

void CMetaBuffer::SwitchToDigest(std::string_view response401) {
    m_digest.method = "GET";
    m_digest.uri = m_streamPath;
    m_authorization = m_digest.BuildAuthorization(response401, m_digestUser, m_digestPassword);
    m_streamRequest = "GET " + m_streamPath + " HTTP/1.0" + "\r\n" + m_authorization + "\r\n";
    m_reconnect = true;
}

void CMetaBuffer::FreeResponse(char* response) {
    delete[] response;
}

int CMetaBuffer::QueueCommand(const char* command, const char* command2) {
    if (command == nullptr) {
        Log().Print(kLogError, kTagQueue, "[%s] Null command.", m_deviceName);
        return QVX_ERR_INVALID_PARAMETERS;
    }
    plat::CScopedLock lock(m_commandLock);
    m_commands.push_back(std::string(m_commandPrefix) + command);
    if (command2 != nullptr) {
        m_commands.push_back(std::string(m_commandPrefix) + command2);
    }
    return QVX_OK;
}

void CMetaBuffer::SendQueuedCommand() {
    std::string command;
    {
        plat::CScopedLock lock(m_commandLock);
        if (m_commands.empty()) {
            return;
        }
        command = m_commands.front();
    }
    // No lock across the request: the host may queue more meanwhile. Only this thread
    // removes entries, so the front is still the one sent.
    char* response = nullptr;
    const int result = RequestCGI(m_timeoutMs, command.c_str(), m_user.c_str(), m_password.c_str(),
                                  &response, nullptr);
    FreeResponse(response);
    plat::CScopedLock lock(m_commandLock);
    if (result == QVX_OK && !m_commands.empty()) {
        m_commands.pop_front();
    }
    while (m_commands.size() > kMaxQueuedCommands) {
        m_commands.pop_front();
    }
}

std::vector<std::string> CMetaBuffer::QueuedCommands() {
    plat::CScopedLock lock(m_commandLock);
    return std::vector<std::string>(m_commands.begin(), m_commands.end());
}

int CMetaBuffer::SetRetryCount(uint16_t count) {
    if (count == 0) {
        Log().Print(kLogError, "CMetaBuffer::SetRetryCount", "Empty retry count.");
        return QVX_ERR_INVALID_PARAMETERS;
    }
    m_retryCount = count;
    return QVX_OK;
}

int CMetaBuffer::GetCameraInfo() {
    {
        plat::CScopedLock lock(m_stateLock);
        if (m_monitorState == kStarting) {
            m_monitorState = kMonitoring;
            m_startEvent.Set();
        }
    }
    if (!m_queryInfo) {
        return QVX_OK;
    }
    if (m_pDateFormatPath == nullptr || m_pVersionPath == nullptr) {
        Log().Print(kLogError, kTagInfo, "[%s] No inquiry path.", m_deviceName);
        return QVX_ERR_INVALID_PARAMETERS;
    }

    std::vector<char> answer;
    cgi::SResponse parsed;
    int result = ExchangeCgi(m_timeoutMs, m_pDateFormatPath, m_user.c_str(), m_password.c_str(),
                             &answer, &parsed);
    if (result != QVX_OK) {
        Log().Print(kLogError, kTagInfo, "[%s] GetDateFormat error.", m_deviceName);
        return result;
    }
    std::string_view body = cgi::BodyOf(std::string_view(answer.data(), answer.size()), parsed);
    int dateFormat = m_dateFormat;
    if (cgi::FindDateFormat(body, &dateFormat) < 0) {
        Log().Print(kLogError, kTagInfo, "[%s] Unknown DateFormat.", m_deviceName);
        return QVX_ERR_UNEXPECTED_DATA;
    }
    SetDateFormat(dateFormat);

    result = ExchangeCgi(m_timeoutMs, m_pVersionPath, m_user.c_str(), m_password.c_str(), &answer,
                         &parsed);
    if (result != QVX_OK) {
        Log().Print(kLogError, kTagInfo, "[%s] GetVersion error.", m_deviceName);
        return result;
    }
    body = cgi::BodyOf(std::string_view(answer.data(), answer.size()), parsed);
    struct SKey {
        const char* key;
        SHaqRevision* revision;
    };
    const SKey keys[] = {{"MovingObjectDetectionVersion=", &m_dmoRevision},
                         {"UnattendedObjectDetectionVersion=", &m_dsoRevision}};
    for (const SKey& key : keys) {
        cgi::SVersion version;
        const int found = cgi::FindVersion(body, key.key, &version);
        if (found < 0) {
            Log().Print(kLogError, kTagInfo, "[%s] Unknown version.", m_deviceName);
            return QVX_ERR_UNEXPECTED_DATA;
        }
        if (found > 0) {
            key.revision->m_major = static_cast<uint16_t>(version.major);
            key.revision->m_minor = static_cast<uint16_t>(version.minor);
            key.revision->m_revision = static_cast<uint16_t>(version.revision);
        }
    }
    return CheckRevisions();
}

int CMetaBuffer::CheckRevisions() {
    CHaqAmf* amf = new (std::nothrow) CHaqAmf();
    if (amf == nullptr) {
        Log().Print(kLogError, kTagInfo, "Alloc fail m_pAmf: %d", ENOMEM);
        Notify(QVX_ERR_MEMORY_ALLOCATION, "Memory error");
        return QVX_ERR_MEMORY_ALLOCATION;
    }
    if (amf->CheckDmoRevision(&m_dmoRevision) == 0) {
        Log().Print(kLogError, kTagInfo, "[%s] DMO version unmatch.", m_deviceName);
        delete amf;
        Notify(QVX_ERR_UNSUPPORTED_DMO_MAJOR, "DMO version unmatch");
        return QVX_ERR_UNSUPPORTED_DMO_MAJOR;
    }
    // Only informative: a camera without unattended-object analytics still streams.
    amf->CheckDsoRevision(&m_dsoRevision);
    delete amf;
    return QVX_OK;
}
