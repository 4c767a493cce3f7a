#ifndef QUORVEX_TESTS_COMMON_PG_DATABASE_H
#define QUORVEX_TESTS_COMMON_PG_DATABASE_H

#include <string>
#include <vector>

struct pg_conn;

namespace testkit {

// A database of its own on the test server that PGHOST, PGPORT and PGUSER name (the
// project's scripts/pg-server starts one), created empty and dropped at the end. Without a
// reachable server the test fails and says so. Raw statements check what the code wrote.
class CPgDatabase {
public:
    explicit CPgDatabase(const std::string& suite);
    virtual ~CPgDatabase();
    CPgDatabase(const CPgDatabase&) = delete;
    CPgDatabase& operator=(const CPgDatabase&) = delete;

    const char* Name() const { return m_name.c_str(); }
    bool Exec(const std::string& sql);
    // Every value of every row of a query, row by row; empty (and a failure) when it fails.
    std::vector<std::vector<std::string>> Query(const std::string& sql);
    // Ends every other session on this database, as a server restart would.
    void DropOtherSessions();

private:
    std::string m_name;
    pg_conn* m_conn = nullptr;
};

}  // namespace testkit

#endif  // QUORVEX_TESTS_COMMON_PG_DATABASE_H
