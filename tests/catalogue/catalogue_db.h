#ifndef QUORVEX_TESTS_CATALOGUE_CATALOGUE_DB_H
#define QUORVEX_TESTS_CATALOGUE_CATALOGUE_DB_H

#include <string>

#include "common/pg_database.h"

namespace testkit {

// A test database that also holds a "StorageLocation" table, which the catalogue reads
// and never creates.
class CCatalogueDb : public CPgDatabase {
public:
    explicit CCatalogueDb(const std::string& suite);
    // A storage location row; returns its ID, -1 when the insert failed.
    long AddStorageLocation(const std::string& path);
};

}  // namespace testkit

#endif  // QUORVEX_TESTS_CATALOGUE_CATALOGUE_DB_H
