#include "quorvex/dwb_table.h"

#include <cerrno>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>
#include <sstream>

#include "quorvex/dwb_types.h"
#include "quorvex/dwb_use_record_set.h"

CDwbDb::ESqlType CDwbTable::m_SqlType = CDwbDb::kSqlPostgreSql;
bool CDwbTable::m_DoUseUTC = false;

namespace {

bool IsPostgres() {
    return CDwbTable::GetSqlType() == CDwbDb::kSqlPostgreSql;
}

// Integers of a database row; anything that is not a whole number within range reads as 0,
// so a damaged row cannot put garbage into a record.
int64_t ParseInteger(const std::string& text, int64_t lo, int64_t hi) {
    const char* s = text.c_str();
    char* end = nullptr;
    errno = 0;
    long long v = std::strtoll(s, &end, 10);
    if (end == s || errno == ERANGE || v < lo || v > hi) {
        return 0;
    }
    return v;
}

// The server's own timestamp form, "YYYY-MM-DD hh:mm:ss" with an optional fraction, read
// without the cost of sscanf: a catalogue search converts three of them per row. Anything
// else (other widths, signs, "BC") is left to the general parse.
bool ParseIsoDateTime(const std::string& text, int* y, int* mo, int* d, int* h, int* mi, int* s) {
    static constexpr char kShape[] = "dddd-dd-dd dd:dd:dd";
    constexpr size_t kLength = sizeof(kShape) - 1;
    if (text.size() < kLength || (text.size() > kLength && text[kLength] != '.')) {
        return false;
    }
    for (size_t i = 0; i < kLength; ++i) {
        const bool digit = text[i] >= '0' && text[i] <= '9';
        if (kShape[i] == 'd' ? !digit : text[i] != kShape[i]) {
            return false;
        }
    }
    auto at = [&text](size_t pos, size_t count) {
        int v = 0;
        for (size_t i = pos; i < pos + count; ++i) {
            v = v * 10 + (text[i] - '0');
        }
        return v;
    };
    *y = at(0, 4);
    *mo = at(5, 2);
    *d = at(8, 2);
    *h = at(11, 2);
    *mi = at(14, 2);
    *s = at(17, 2);
    return true;
}

void StoreInteger(void* target, int size, int64_t value) {
    switch (size) {
        case 1: {
            int8_t v = static_cast<int8_t>(value);
            std::memcpy(target, &v, sizeof(v));
            break;
        }
        case 2: {
            int16_t v = static_cast<int16_t>(value);
            std::memcpy(target, &v, sizeof(v));
            break;
        }
        case 8:
            std::memcpy(target, &value, sizeof(value));
            break;
        default: {
            int32_t v = static_cast<int32_t>(value);
            std::memcpy(target, &v, sizeof(v));
            break;
        }
    }
}

int64_t LoadInteger(const void* source, int size) {
    switch (size) {
        case 1: {
            int8_t v;
            std::memcpy(&v, source, sizeof(v));
            return v;
        }
        case 2: {
            int16_t v;
            std::memcpy(&v, source, sizeof(v));
            return v;
        }
        case 8: {
            int64_t v;
            std::memcpy(&v, source, sizeof(v));
            return v;
        }
        default: {
            int32_t v;
            std::memcpy(&v, source, sizeof(v));
            return v;
        }
    }
}

void IntegerRange(int size, int64_t* lo, int64_t* hi) {
    switch (size) {
        case 1:
            *lo = INT8_MIN;
            *hi = INT8_MAX;
            break;
        case 2:
            *lo = INT16_MIN;
            *hi = INT16_MAX;
            break;
        case 8:
            *lo = INT64_MIN;
            *hi = INT64_MAX;
            break;
        default:
            *lo = INT32_MIN;
            *hi = INT32_MAX;
            break;
    }
}

std::string FloatLiteral(float value) {
    if (std::isnan(value)) {
        return IsPostgres() ? "'NaN'" : "0";
    }
    if (std::isinf(value)) {
        if (IsPostgres()) {
            return value > 0 ? "'Infinity'" : "'-Infinity'";
        }
        return "0";
    }
    std::ostringstream out;
    out << static_cast<double>(value);
    return out.str();
}

std::string TextLiteral(const char* text) {
    std::string escaped = CDwbTable::EscapeForPostgreSQL(text, true);
    // In PostgreSQL's E'' form a doubled quote and a doubled backslash each stand for one,
    // so the stored text equals the given one whatever standard_conforming_strings says.
    return (IsPostgres() ? "E'" : "'") + escaped + "'";
}

}  // namespace

CDwbTable::CDwbTable(CDwbDb* db) : m_pDb(db), m_pResult(nullptr) {}

CDwbTable::~CDwbTable() {
    Close();
}

void CDwbTable::SetSqlType(CDwbDb::ESqlType type) {
    m_SqlType = type;
}
CDwbDb::ESqlType CDwbTable::GetSqlType() {
    return m_SqlType;
}
void CDwbTable::SetDoUseUTC(bool useUtc) {
    m_DoUseUTC = useUtc;
}
bool CDwbTable::GetDoUseUTC() {
    return m_DoUseUTC;
}

void CDwbTable::AddColumn(const char* name, EColumnType type, int size, void* value) {
    m_columns.emplace_back(name, type, size, value);
}

void CDwbTable::SetTableName(const char* name) {
    m_name = IsPostgres() ? std::string("\"") + name + "\"" : std::string(name);
}

bool CDwbTable::Open(CDwbDbResult::ECursorType type) {
    if (m_pResult != nullptr || !IsConnected()) {
        return false;
    }
    m_pResult = m_pDb->GetConnection()->CreateResult(type);
    return m_pResult != nullptr;
}

bool CDwbTable::Close() {
    delete m_pResult;
    m_pResult = nullptr;
    return true;
}

int CDwbTable::StatementFailure() const {
    return IsConnected() ? DWB_ERR_SQL_EXEC : DWB_ERR_DB_NOT_CONNECT;
}

bool CDwbTable::IsConnected() const {
    return m_pDb != nullptr && m_pDb->IsConnected();
}

bool CDwbTable::ExecuteSql(const char* sql) {
    if (m_pDb == nullptr || m_pResult == nullptr) {
        return false;
    }
    return m_pDb->ExecuteSql(sql, m_pResult);
}

std::string CDwbTable::QuotedColumn(int index) const {
    const std::string& name = m_columns[static_cast<size_t>(index)].m_name;
    return IsPostgres() ? "\"" + name + "\"" : "`" + name + "`";
}

std::string CDwbTable::LiteralOf(EColumnType type, int size, const void* value) const {
    char buf[32];
    switch (type) {
        case kColumnIdentity:
            std::snprintf(buf, sizeof(buf), "%lld", static_cast<long long>(LoadInteger(value, 4)));
            return buf;
        case kColumnInteger:
            std::snprintf(buf, sizeof(buf), "%lld",
                          static_cast<long long>(LoadInteger(value, size)));
            return buf;
        case kColumnBool: {
            bool b;
            std::memcpy(&b, value, sizeof(b));
            if (IsPostgres()) {
                return b ? "true" : "false";
            }
            return b ? "1" : "0";
        }
        case kColumnText:
            return TextLiteral(static_cast<const std::string*>(value)->c_str());
        case kColumnTime:
            return static_cast<const CTimeSpan*>(value)->Format("'%H:%M:%S'");
        case kColumnDateTime: {
            const CDateTime* t = static_cast<const CDateTime*>(value);
            const char* pattern = IsPostgres() ? "'%Y-%O-%D %H:%M:%S'" : "#%Y-%O-%D %H:%M:%S#";
            return t->Format(pattern, m_DoUseUTC);
        }
        case kColumnFloat: {
            float f;
            std::memcpy(&f, value, sizeof(f));
            return FloatLiteral(f);
        }
    }
    return std::string();
}

std::string CDwbTable::FormatValue(int index) const {
    if (!ValidIndex(index)) {
        return std::string();
    }
    const CColumn& col = m_columns[static_cast<size_t>(index)];
    if (col.m_pValue == nullptr) {
        return "NULL";
    }
    return LiteralOf(col.m_type, col.m_size, col.m_pValue);
}

std::string CDwbTable::FormatValueParm(int index, va_list& args) const {
    if (!ValidIndex(index)) {
        return std::string();
    }
    const CColumn& col = m_columns[static_cast<size_t>(index)];
    switch (col.m_type) {
        case kColumnIdentity: {
            int32_t v = va_arg(args, int);
            return LiteralOf(kColumnIdentity, 4, &v);
        }
        case kColumnInteger: {
            int64_t v = col.m_size == 8 ? va_arg(args, int64_t) : va_arg(args, int);
            return LiteralOf(kColumnInteger, 8, &v);
        }
        case kColumnBool: {
            bool b = va_arg(args, int) != 0;
            return LiteralOf(kColumnBool, 1, &b);
        }
        case kColumnText: {
            const char* text = va_arg(args, const char*);
            return TextLiteral(text);
        }
        case kColumnTime: {
            const CTimeSpan* span = va_arg(args, const CTimeSpan*);
            if (span == nullptr) {
                return "NULL";
            }
            return span->Format(IsPostgres() ? "'%H:%M:%S'" : "#%H:%M:%S#");
        }
        case kColumnDateTime: {
            const CDateTime* t = va_arg(args, const CDateTime*);
            return t != nullptr ? LiteralOf(kColumnDateTime, 0, t) : "NULL";
        }
        case kColumnFloat: {
            const float* f = va_arg(args, const float*);
            return f != nullptr ? FloatLiteral(*f) : "NULL";
        }
    }
    return std::string();
}

std::string CDwbTable::FormatColumn(int index, const char* op) const {
    if (!ValidIndex(index)) {
        return std::string();
    }
    return QuotedColumn(index) + op + FormatValue(index);
}

std::string CDwbTable::FormatColumnParm(const char* op, int index, va_list& args) const {
    if (!ValidIndex(index)) {
        return std::string();
    }
    return QuotedColumn(index) + op + FormatValueParm(index, args);
}

namespace {

// Joins the terms of the listed columns, skipping bad indexes.
template <typename Term>
std::string JoinTerms(const CDwbTable::CColumnList& cols, const char* separator, Term term) {
    std::string out;
    bool first = true;
    for (int index : cols) {
        std::string t = term(index);
        if (t.empty()) {
            continue;
        }
        if (!first) {
            out += separator;
        }
        out += t;
        first = false;
    }
    return out;
}

}  // namespace

std::string CDwbTable::BuildInsert(const CColumnList& cols) const {
    CColumnList valid;
    for (int index : cols) {
        if (ValidIndex(index)) {
            valid.push_back(index);
        }
    }
    return "INSERT INTO " + m_name + " (" +
           JoinTerms(valid, ",", [this](int i) { return QuotedColumn(i); }) + ") VALUES (" +
           JoinTerms(valid, ",", [this](int i) { return FormatValue(i); }) + ")";
}

std::string CDwbTable::BuildUpdate(const CColumnList& set, const CColumnList& where) const {
    return "UPDATE " + m_name + " SET " +
           JoinTerms(set, ",", [this](int i) { return FormatColumn(i, "="); }) + " WHERE " +
           JoinTerms(where, " AND ", [this](int i) { return FormatColumn(i, "="); });
}

std::string CDwbTable::BuildSelect(const CColumnList& where, const CColumnList& order) const {
    std::string sql = "SELECT * FROM " + m_name;
    if (!where.empty()) {
        sql +=
            " WHERE " + JoinTerms(where, " AND ", [this](int i) { return FormatColumn(i, "="); });
    }
    if (!order.empty()) {
        sql += " ORDER BY " + JoinTerms(order, ",", [this](int i) {
                   return ValidIndex(i) ? QuotedColumn(i) : std::string();
               });
    }
    return sql;
}

std::string CDwbTable::BuildDelete(const CColumnList& where) const {
    std::string sql =
        std::string("DELETE ") + (m_SqlType == CDwbDb::kSqlAccess ? "* " : "") + "FROM " + m_name;
    if (!where.empty()) {
        sql +=
            " WHERE " + JoinTerms(where, " AND ", [this](int i) { return FormatColumn(i, "="); });
    }
    return sql;
}

bool CDwbTable::Insert(const CColumnList& cols) {
    return ExecuteSql(BuildInsert(cols).c_str());
}

bool CDwbTable::Update(const CColumnList& set, const CColumnList& where) {
    return ExecuteSql(BuildUpdate(set, where).c_str());
}

bool CDwbTable::Select(const CColumnList& where, const CColumnList& order) {
    return ExecuteSql(BuildSelect(where, order).c_str());
}

bool CDwbTable::Delete(const CColumnList& where) {
    return ExecuteSql(BuildDelete(where).c_str());
}

std::string CDwbTable::WhereParm(const char* head, const CColumnList& where, va_list& args) const {
    std::string sql = head;
    bool first = true;
    for (int index : where) {
        if (!ValidIndex(index)) {
            continue;
        }
        if (!first) {
            sql += " AND ";
        }
        sql += FormatColumnParm("=", index, args);
        first = false;
    }
    return sql;
}

std::string CDwbTable::BuildUpdateParm(const CColumnList& set, const CColumnList& where,
                                       va_list& args) const {
    std::string sql = "UPDATE " + m_name + " SET ";
    bool first = true;
    for (int index : set) {
        if (!ValidIndex(index)) {
            continue;
        }
        if (!first) {
            sql += ",";
        }
        sql += FormatColumnParm("=", index, args);
        first = false;
    }
    return WhereParm((sql + " WHERE ").c_str(), where, args);
}

bool CDwbTable::InsertParm(CColumnList cols, ...) {
    va_list args;
    va_start(args, cols);
    std::string names;
    std::string values;
    bool first = true;
    for (int index : cols) {
        if (!ValidIndex(index)) {
            continue;
        }
        if (!first) {
            names += ",";
            values += ",";
        }
        names += QuotedColumn(index);
        values += FormatValueParm(index, args);
        first = false;
    }
    va_end(args);
    return ExecuteSql(
        ("INSERT INTO " + m_name + " (" + names + ") VALUES (" + values + ")").c_str());
}

bool CDwbTable::UpdateParm(CColumnList set, CColumnList where, ...) {
    va_list args;
    va_start(args, where);
    std::string sql = BuildUpdateParm(set, where, args);
    va_end(args);
    return ExecuteSql(sql.c_str());
}

bool CDwbTable::SelectParm(CColumnList where, ...) {
    va_list args;
    va_start(args, where);
    std::string sql = WhereParm(("SELECT * FROM " + m_name + " WHERE ").c_str(), where, args);
    va_end(args);
    return ExecuteSql(sql.c_str());
}

bool CDwbTable::DeleteParm(CColumnList where, ...) {
    va_list args;
    va_start(args, where);
    std::string head = std::string("DELETE ") + (m_SqlType == CDwbDb::kSqlAccess ? "* " : "") +
                       "FROM " + m_name + " WHERE ";
    std::string sql = WhereParm(head.c_str(), where, args);
    va_end(args);
    return ExecuteSql(sql.c_str());
}

int CDwbTable::GetRowCount() {
    if (m_pDb == nullptr || m_pResult == nullptr) {
        return 0;
    }
    return m_pDb->GetRowCount(m_pResult);
}

long CDwbTable::GetLastID() {
    if (m_pDb == nullptr || m_pResult == nullptr) {
        return 0;
    }
    return m_pDb->GetLastID(m_pResult, m_name.c_str());
}

bool CDwbTable::MoveNext() {
    if (m_pDb == nullptr || m_pResult == nullptr || !m_pDb->MoveNext(m_pResult)) {
        return false;
    }
    return ResultToValue();
}

bool CDwbTable::MoveNextParm(CColumnList cols, ...) {
    if (m_pDb == nullptr || m_pResult == nullptr || !m_pDb->MoveNext(m_pResult)) {
        return false;
    }
    va_list args;
    va_start(args, cols);
    bool ok = ResultToValueParm(cols, args);
    va_end(args);
    return ok;
}

bool CDwbTable::MoveLast() {
    if (m_pDb == nullptr || m_pResult == nullptr || !m_pDb->MoveLast(m_pResult)) {
        return false;
    }
    return ResultToValue();
}

namespace {

void ConvertInto(const CDwbTable::CColumn& col, const std::string& text, void* target) {
    switch (col.m_type) {
        case CDwbTable::kColumnIdentity:
            StoreInteger(target, 4, ParseInteger(text, INT32_MIN, INT32_MAX));
            break;
        case CDwbTable::kColumnInteger: {
            int64_t lo;
            int64_t hi;
            IntegerRange(col.m_size, &lo, &hi);
            StoreInteger(target, col.m_size, ParseInteger(text, lo, hi));
            break;
        }
        case CDwbTable::kColumnBool: {
            bool b = IsPostgres() ? text == "t" : ParseInteger(text, INT64_MIN, INT64_MAX) != 0;
            std::memcpy(target, &b, sizeof(b));
            break;
        }
        case CDwbTable::kColumnText:
            *static_cast<std::string*>(target) = text;
            break;
        case CDwbTable::kColumnTime: {
            int h = 0;
            int m = 0;
            int s = 0;
            CTimeSpan span;
            if (std::sscanf(text.c_str(), "%d:%d:%d", &h, &m, &s) == 3) {
                span = CTimeSpan::FromComponents(0, 0, h, m, s, 0);
            }
            *static_cast<CTimeSpan*>(target) = span;
            break;
        }
        case CDwbTable::kColumnDateTime: {
            int y = 0;
            int mo = 0;
            int d = 0;
            int h = 0;
            int mi = 0;
            int s = 0;
            CDateTime t;
            if (ParseIsoDateTime(text, &y, &mo, &d, &h, &mi, &s) ||
                std::sscanf(text.c_str(), "%d-%d-%d %d:%d:%d", &y, &mo, &d, &h, &mi, &s) == 6) {
                t = CDateTime::FromComponents(y, mo, d, h, mi, s, 0, 0, CDwbTable::GetDoUseUTC());
            }
            *static_cast<CDateTime*>(target) = t;
            break;
        }
        case CDwbTable::kColumnFloat: {
            char* end = nullptr;
            float f = std::strtof(text.c_str(), &end);
            if (end == text.c_str()) {
                f = 0.0f;
            }
            std::memcpy(target, &f, sizeof(f));
            break;
        }
    }
}

}  // namespace

bool CDwbTable::ResultToValue() {
    if (m_pResult == nullptr || m_pResult->GetColumnCount() != static_cast<int>(m_columns.size())) {
        return false;
    }
    for (size_t i = 0; i < m_columns.size(); ++i) {
        if (m_columns[i].m_pValue != nullptr) {
            ConvertInto(m_columns[i], m_pResult->GetValue(static_cast<int>(i)),
                        m_columns[i].m_pValue);
        }
    }
    return true;
}

bool CDwbTable::ResultToValueParm(const CColumnList& cols, va_list& args) {
    if (m_pResult == nullptr || m_pResult->GetColumnCount() != static_cast<int>(m_columns.size())) {
        return false;
    }
    for (int index : cols) {
        void* target = va_arg(args, void*);
        if (!ValidIndex(index) || target == nullptr) {
            continue;
        }
        ConvertInto(m_columns[static_cast<size_t>(index)], m_pResult->GetValue(index), target);
    }
    return true;
}

std::string CDwbTable::BuildCreateTable() const {
    std::string sql = "CREATE TABLE ";
    if (m_SqlType == CDwbDb::kSqlMySql) {
        sql += "IF NOT EXISTS ";
    }
    sql += IsPostgres() ? m_name : "`" + m_name + "`";
    sql += " (";
    for (size_t i = 0; i < m_columns.size(); ++i) {
        const CColumn& col = m_columns[i];
        if (i > 0) {
            sql += ",";
        }
        sql += "\"" + col.m_name + "\" ";
        char text[32];
        switch (col.m_type) {
            case kColumnIdentity:
                sql += m_SqlType == CDwbDb::kSqlMySql    ? "INTEGER AUTO_INCREMENT PRIMARY KEY"
                       : m_SqlType == CDwbDb::kSqlAccess ? "COUNTER PRIMARY KEY"
                                                         : "SERIAL";
                break;
            case kColumnInteger:
                if (col.m_size == 8) {
                    sql += "DOUBLE";
                } else if (col.m_size == 4) {
                    sql += "INTEGER";
                } else if (col.m_size == 1) {
                    sql += m_SqlType == CDwbDb::kSqlMySql    ? "TINYINT"
                           : m_SqlType == CDwbDb::kSqlAccess ? "BYTE"
                                                             : "SMALLINT";
                } else {
                    sql += "SMALLINT";
                }
                break;
            case kColumnBool:
                sql += IsPostgres() ? "BOOLEAN" : "BIT";
                break;
            case kColumnText:
                std::snprintf(text, sizeof(text),
                              m_SqlType == CDwbDb::kSqlAccess ? "TEXT(%d)" : "VARCHAR(%d)",
                              col.m_size);
                sql += text;
                break;
            case kColumnTime:
                sql += IsPostgres() ? "TIME(4) without time zone" : "TIME";
                break;
            case kColumnDateTime:
                sql += IsPostgres() ? "TIMESTAMP(4) without time zone" : "DATETIME";
                break;
            case kColumnFloat:
                sql += "FLOAT";
                break;
        }
    }
    return sql + ")";
}

bool CDwbTable::CreateTable() {
    CDwbUseRecordSet cursor(this, CDwbDbResult::kCursorSchema);
    if (!cursor.IsSuccessful()) {
        return false;
    }
    return ExecuteSql(BuildCreateTable().c_str());
}

std::string CDwbTable::EscapeForPostgreSQL(const char* text, bool escape) {
    if (text == nullptr) {
        return std::string();
    }
    if (std::strpbrk(text, "'\\") == nullptr) {
        return text;
    }
    // Texts are UTF-8, whose trail bytes are never a quote or a backslash: a byte-wise scan
    // cannot split a character.
    std::string out;
    size_t occurrence = 0;
    for (const char* p = text; *p != '\0'; ++p) {
        if (*p != '\'' && *p != '\\') {
            out += *p;
            continue;
        }
        if (escape) {
            out += *p;
            out += *p;
        } else if (occurrence++ % 2 == 1) {
            out += *p;
        }
    }
    return out;
}
