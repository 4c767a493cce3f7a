#ifndef QUORVEX_STREAM_META_BUFFER_H
#define QUORVEX_STREAM_META_BUFFER_H

#include <cstddef>
#include <cstdint>
#include <deque>
#include <string>
#include <string_view>
#include <vector>

#include "analytics/haq_amf.h"
#include "platform/critical_section.h"
#include "platform/event.h"
#include "platform/tcp_socket.h"
#include "quorvex/meta_data.h"
#include "stream/cgi_response.h"
#include "stream/http_digest.h"

// The HTTP client of one camera: one-shot CGI requests with Basic authentication, the
// camera inquiry that precedes every stream connection, the queue of camera commands that
// the monitor thread sends, and the stream request. Transport failures reach the host
// through the notification callback as (camera index, context, null, code, text, null,
// false).
class CMetaBuffer {
public:
    static constexpr size_t kDeviceNameSize = 512;
    static constexpr size_t kHostSize = 40;
    // The facade hands over "http://host:port" of a proxied camera, which may run longer
    // than a bare address.
    static constexpr size_t kCommandPrefixSize = 80;
    // "user:password" and its Base64 form; both also bound the stream request's credentials.
    static constexpr size_t kCredentialsSize = 512;
    static constexpr size_t kBase64Size = 688;
    static constexpr size_t kRequestSize = 2048;
    // A CGI answer is read in chunks of this size until one comes back short.
    static constexpr long kReceiveChunk = 1024;
    // Inquiry and command answers are a few hundred bytes; a peer that keeps sending is not
    // a camera answering a CGI request.
    static constexpr size_t kMaxResponseBytes = 1024 * 1024;
    static constexpr size_t kMaxQueuedCommands = 20;

    enum EMonitorState { kIdle = 0, kMonitoring = 1, kStopping = 2, kStarting = 3 };

    CMetaBuffer();
    virtual ~CMetaBuffer();
    CMetaBuffer(const CMetaBuffer&) = delete;
    CMetaBuffer& operator=(const CMetaBuffer&) = delete;

    // The connection settings: device name, camera (or proxy) address, credentials, the
    // stream request and the callback. 1, -1001 (a text that does not fit) or -1021 (the
    // host cannot be resolved).
    int InitializeTransport(const char* deviceName, const char* host, uint16_t port,
                            uint32_t timeoutMs, const char* streamPath, const char* user,
                            const char* password, MetaCallback callback, int cameraIndex,
                            void* context, const char* commandPrefix);

    // Paths of the two inquiries; the texts belong to the facade and must outlive this object.
    void SetInquiryPaths(const char* dateFormatPath, const char* versionPath);
    // Credentials for Digest authentication of the stream, independent of the Basic ones.
    void SetDigestCredentials(const char* user, const char* password);

    // A non-blocking TCP connection to the peer, or kInvalidSocket.
    plat::SocketHandle Connect(uint32_t timeoutMs);
    // Receives exactly len bytes unless the peer closes first (then the count so far);
    // negative on a failed or timed-out wait, or a failed receive.
    long recv_n(uint32_t timeoutMs, plat::SocketHandle s, char* buf, long len, int flags);
    // Bytes actually sent, never negative.
    long SendAll(plat::SocketHandle s, const char* buf, long len);
    // Shuts down and closes the socket, if any, and marks it closed.
    static void CloseSocket(plat::SocketHandle& s);
    void CloseSocket();
    // Base64 of a text into out (terminated); false when it does not fit.
    static bool Base64Encode(const char* text, char* out, size_t outSize);

    // One GET with Basic authentication on a connection of its own. On 1 *response holds
    // the body (or the whole answer when no body length was announced) and *length the
    // announced length. A buffer handed out (also on HTTP and length errors) belongs to the
    // caller, who releases it with FreeResponse.
    int RequestCGI(uint32_t timeoutMs, const char* path, const char* user, const char* password,
                   char** response, unsigned* length);
    static void FreeResponse(char* response);

    // Turns a starting monitor into a running one, then asks the camera for its date format
    // and analytics versions and checks the versions against the engine.
    int GetCameraInfo();

    // Appends the command prefix and command (and the second one, when given) to the queue.
    int QueueCommand(const char* command, const char* command2 = nullptr);
    // Sends the oldest queued command; it leaves the queue only when the camera took it.
    // Afterwards the queue is cut to its newest kMaxQueuedCommands entries. Runs on the
    // monitor thread each time it is about to wait for stream data.
    void SendQueuedCommand();

    int SetRetryCount(uint16_t count);

    int MonitorState();
    int LastError();
    int DateFormat() const { return m_dateFormat; }
    const SHaqRevision& DmoRevision() const { return m_dmoRevision; }
    const SHaqRevision& DsoRevision() const { return m_dsoRevision; }
    uint16_t RetryCount() const { return m_retryCount; }
    const std::string& StreamRequest() const { return m_streamRequest; }
    const char* DeviceName() const { return m_deviceName; }
    std::vector<std::string> QueuedCommands();

protected:
    // Steps of the full initialisation; the ring buffer is set up between them.
    int InitializeRequest(const char* deviceName, const char* commandPrefix, const char* streamPath,
                          const char* user, const char* password);
    int InitializePeer(const char* host, uint16_t port, uint32_t timeoutMs, MetaCallback callback,
                       int cameraIndex, void* context);

    void SetMonitorState(int state);
    void SetLastError(int error);
    void SetQueryInfo(bool queryInfo) { m_queryInfo = queryInfo; }
    void SetDateFormat(int dateFormat) { m_dateFormat = dateFormat; }
    void Notify(int code, const char* text);
    // Asks the analytics engine whether it supports the camera's analytics versions.
    int CheckRevisions();

    // Replaces the stream request by one answering the Digest challenge of a 401 answer
    // and asks for an immediate reconnection.
    void SwitchToDigest(std::string_view response401);
    bool ReconnectRequested() const { return m_reconnect; }

    // The request and the answer of RequestCGI, with the answer as received.
    int ExchangeCgi(uint32_t timeoutMs, const char* path, const char* user, const char* password,
                    std::vector<char>* answer, cgi::SResponse* parsed);
    // "GET <path> HTTP/1.0\r\nAuthorization: Basic <user:password>"; false when too long.
    bool BuildBasicRequest(const char* tag, const char* path, const char* user,
                           const char* password, std::string* request);

    char m_deviceName[kDeviceNameSize] = {};
    char m_host[kHostSize] = {};
    uint16_t m_port = 0;
    char m_commandPrefix[kCommandPrefixSize] = {};
    plat::SIpv4Endpoint m_peer;
    uint32_t m_timeoutMs = 0;
    std::string m_user;
    std::string m_password;
    std::string m_streamPath;
    std::string m_streamRequest;
    plat::SocketHandle m_socket = plat::kInvalidSocket;

    MetaCallback m_callback = nullptr;
    int m_cameraIndex = 0;
    void* m_context = nullptr;

    bool m_queryInfo = true;
    const char* m_pDateFormatPath = nullptr;
    const char* m_pVersionPath = nullptr;
    int m_dateFormat = 0;
    SHaqRevision m_dmoRevision = {};
    SHaqRevision m_dsoRevision = {};
    uint16_t m_retryCount = 0;

    plat::CCriticalSection m_stateLock;
    int m_monitorState = kIdle;
    plat::CCriticalSection m_errorLock;
    int m_lastError = 1;
    plat::CCriticalSection m_statisticsLock;
    plat::CEvent m_startEvent{false, false};

    // Host threads append, the monitor thread consumes.
    plat::CCriticalSection m_commandLock;
    std::deque<std::string> m_commands;

    std::string m_digestUser;
    std::string m_digestPassword;
    CHttpDigest m_digest;
    std::string m_authorization;
    bool m_reconnect = false;
};

#endif  // QUORVEX_STREAM_META_BUFFER_H
