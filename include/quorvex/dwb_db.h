#ifndef QUORVEX_DWB_DB_H
#define QUORVEX_DWB_DB_H

#include "quorvex/dwb_db_connect.h"
#include "quorvex/dwb_db_result.h"
#include "quorvex/dwb_lock.h"
#include "quorvex/export.h"

// The database: owns the current connection and forwards statements and cursor moves to it.
class QUORVEX_API CDwbDb {
public:
    // SQL dialect of the statements that the tables build.
    enum ESqlType { kSqlMySql = 0, kSqlAccess = 1, kSqlPostgreSql = 2 };

    CDwbDb();
    virtual ~CDwbDb();
    CDwbDb(const CDwbDb&) = delete;
    CDwbDb& operator=(const CDwbDb&) = delete;

    // Always false: the base database has no query of its own.
    virtual bool Query() { return false; }
    virtual int CountRemainingRows(CDwbDbResult* result);

    // Replaces any connection by a fresh one of that kind and connects it; false for a kind
    // that does not exist. Sets the dialect of every table.
    bool Connect(EConnectionType kind, ESqlType sqlType, const char* database, const char* user,
                 const char* password);
    bool Disconnect();
    bool ExecuteSql(const char* sql, CDwbDbResult* result);
    bool MoveNext(CDwbDbResult* result);
    bool MoveLast(CDwbDbResult* result);
    bool MoveFirst(CDwbDbResult* result);
    int GetRowCount(CDwbDbResult* result);
    long GetLastID(CDwbDbResult* result, const char* tableName);

    CDwbDbConnect* GetConnection() const { return m_pConnection; }
    bool IsConnected() const { return m_pConnection != nullptr && m_pConnection->IsConnected(); }

private:
    CDwbLock* m_pConnectLock;
    CDwbLock* m_pSpareLock;
    CDwbDbConnect* m_pConnection;
    int m_reserved;
};

#endif  // QUORVEX_DWB_DB_H
