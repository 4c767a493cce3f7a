#ifndef QUORVEX_TESTS_CATALOGUE_CATALOGUE_DB_H
#define QUORVEX_TESTS_CATALOGUE_CATALOGUE_DB_H

#include <libpq-fe.h>

#include <string>
#include <vector>

namespace testkit {

// A database of its own on the server that PGHOST, PGPORT and PGUSER name, created empty
// but for a "StorageLocation" table (which the catalogue reads and never creates), and
// dropped again at the end. Raw statements check what the catalogue wrote.
class CCatalogueDb {
public:
    explicit CCatalogueDb(const std::string& suite);
    ~CCatalogueDb();
    CCatalogueDb(const CCatalogueDb&) = delete;
    CCatalogueDb& operator=(const CCatalogueDb&) = delete;

    const char* Name() const { return m_name.c_str(); }
    bool Exec(const std::string& sql);
    // Every value of every row of a query, row by row; empty when it fails.
    std::vector<std::vector<std::string>> Query(const std::string& sql);
    // Ends every other session on this database, as a server restart would.
    void DropOtherSessions();
    // A storage location row; returns its ID.
    long AddStorageLocation(const std::string& path);

private:
    std::string m_name;
    PGconn* m_conn = nullptr;
};

}  // namespace testkit

#endif  // QUORVEX_TESTS_CATALOGUE_CATALOGUE_DB_H
