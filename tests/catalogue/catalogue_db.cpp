#include "catalogue_db.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace testkit {

CCatalogueDb::CCatalogueDb(const std::string& suite) : CPgDatabase("cat_" + suite) {
    EXPECT_TRUE(
        Exec("CREATE TABLE \"StorageLocation\" (\"ID\" SERIAL, \"FullPath\" VARCHAR(255))"));
}

long CCatalogueDb::AddStorageLocation(const std::string& path) {
    std::string quoted;
    for (char ch : path) {
        quoted += ch;
        if (ch == '\'') {
            quoted += '\'';
        }
    }
    auto rows = Query("INSERT INTO \"StorageLocation\" (\"FullPath\") VALUES ('" + quoted +
                      "') RETURNING \"ID\"");
    return rows.empty() ? -1 : std::atol(rows[0][0].c_str());
}

}  // namespace testkit
