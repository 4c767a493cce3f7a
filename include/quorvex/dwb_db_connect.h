#ifndef QUORVEX_DWB_DB_CONNECT_H
#define QUORVEX_DWB_DB_CONNECT_H

#include "quorvex/dwb_db_result.h"
#include "quorvex/export.h"

// Kinds of database connection; PostgreSQL is the one that exists.
enum EConnectionType { kConnectionNone = 0, kConnectionPostgreSql = 3 };

// A connection to a database server: statements, transactions and result cursors.
class QUORVEX_API CDwbDbConnect {
public:
    CDwbDbConnect() = default;
    virtual ~CDwbDbConnect() = default;
    CDwbDbConnect(const CDwbDbConnect&) = delete;
    CDwbDbConnect& operator=(const CDwbDbConnect&) = delete;

    virtual bool Connect(const char* database, const char* user, const char* password) = 0;
    virtual bool Disconnect() = 0;
    virtual bool Begin() = 0;
    virtual bool Rollback() = 0;
    virtual bool Commit() = 0;
    virtual bool ExecuteSql(const char* sql, CDwbDbResult* result) = 0;
    virtual bool MoveNext(CDwbDbResult* result) = 0;
    virtual bool MoveLast(CDwbDbResult* result) = 0;
    virtual bool MoveFirst(CDwbDbResult* result) = 0;
    virtual int GetRowCount(CDwbDbResult* result) = 0;
    virtual int CountRemainingRows(CDwbDbResult* result) = 0;
    virtual long GetLastID(CDwbDbResult* result, const char* tableName) = 0;
    // A new result cursor; the caller owns it.
    virtual CDwbDbResult* CreateResult(CDwbDbResult::ECursorType type) = 0;

    EConnectionType GetType() const { return m_type; }
    bool IsConnected() const { return m_connected; }

protected:
    EConnectionType m_type = kConnectionNone;
    bool m_connected = false;
};

#endif  // QUORVEX_DWB_DB_CONNECT_H
