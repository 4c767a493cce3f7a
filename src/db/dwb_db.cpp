#include "quorvex/dwb_db.h"

#include <mutex>
#include <new>

#include "quorvex/dwb_db_connect_pgsql.h"
#include "quorvex/dwb_table.h"

CDwbDb::CDwbDb()
    : m_pConnectLock(new CDwbLock(true, 4000)),
      m_pSpareLock(new CDwbLock(true, 4000)),
      m_pConnection(nullptr),
      m_reserved(0) {}

CDwbDb::~CDwbDb() {
    if (m_pConnection != nullptr && m_pConnection->IsConnected()) {
        m_pConnection->Disconnect();
    }
    delete m_pConnection;
    delete m_pConnectLock;
    delete m_pSpareLock;
}

bool CDwbDb::Connect(EConnectionType kind, ESqlType sqlType, const char* database, const char* user,
                     const char* password) {
    std::lock_guard<CDwbLock> guard(*m_pConnectLock);
    delete m_pConnection;
    m_pConnection = nullptr;
    if (kind == kConnectionPostgreSql) {
        m_pConnection = new (std::nothrow) CDwbDbConnectPgsql();
    }
    if (m_pConnection == nullptr) {
        return false;
    }
    CDwbTable::SetSqlType(sqlType);
    return m_pConnection->Connect(database, user, password);
}

// Every forwarder refuses politely when there is no connection: a host may call them before
// Connect or after a failed one.
bool CDwbDb::Disconnect() {
    return m_pConnection == nullptr || m_pConnection->Disconnect();
}

bool CDwbDb::ExecuteSql(const char* sql, CDwbDbResult* result) {
    return m_pConnection != nullptr && m_pConnection->ExecuteSql(sql, result);
}

bool CDwbDb::MoveNext(CDwbDbResult* result) {
    return m_pConnection != nullptr && m_pConnection->MoveNext(result);
}

bool CDwbDb::MoveLast(CDwbDbResult* result) {
    return m_pConnection != nullptr && m_pConnection->MoveLast(result);
}

bool CDwbDb::MoveFirst(CDwbDbResult* result) {
    return m_pConnection != nullptr && m_pConnection->MoveFirst(result);
}

int CDwbDb::GetRowCount(CDwbDbResult* result) {
    return m_pConnection != nullptr ? m_pConnection->GetRowCount(result) : 0;
}

int CDwbDb::CountRemainingRows(CDwbDbResult* result) {
    return m_pConnection != nullptr ? m_pConnection->CountRemainingRows(result) : 0;
}

long CDwbDb::GetLastID(CDwbDbResult* result, const char* tableName) {
    return m_pConnection != nullptr ? m_pConnection->GetLastID(result, tableName) : 0;
}
