// What the process knows about tables.
//
// The first definition that is seen under a name serves every later handle of that name. What
// follows from it is kept beside it: the members as the operations need them, and a template for
// each shape of row that was read. One thread at a time, as everywhere in the library.

#ifndef VORN_SCHEMA_KNOWN_TABLES_H
#define VORN_SCHEMA_KNOWN_TABLES_H

#include <array>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include <json/json.h>

#include "RowTemplate.h"
#include "TableTypes.h"

namespace vornjsondb {

class KnownTable {
  public:
    explicit KnownTable(std::string strName) : m_strName(std::move(strName)) {}

    // What recType hands out. A host may write into it, so nothing points into it.
    Json::Value jTypes;

    // The members; none when jTypes is no object. Members that a host adds to jTypes are seen
    // (reading a member that is missing adds it), other changes are not.
    const TableTypes& Types();

    // The template for rows of these columns, or nullptr when there is none: a column has no name,
    // is not declared, comes twice or cannot be read, or there are too many shapes already.
    const RowTemplate* TemplateFor(int nColumns, char** szNames);

  private:
    friend class KnownTables;

    // More shapes than the library's own statements give a table; columns without end are read one
    // by one.
    static constexpr size_t kMaxTemplates = 16;

    const std::string m_strName;
    std::unique_ptr<const TableTypes> m_pTypes;
    std::array<std::unique_ptr<const RowTemplate>, kMaxTemplates> m_Templates;
};

class KnownTables {
  public:
    static KnownTables& OfProcess();

    // The table of that name, or nullptr.
    KnownTable* Find(const std::string& strName);

    // The same; a name that is not known becomes known, with no types.
    KnownTable& FindOrAdd(const std::string& strName);

    // What recType knows of all tables: an object by table names, null when there are none.
    Json::Value AllTypes() const;

    // Forgets all tables: the process knows as little as when it started. Records that were read
    // before stay whole.
    void Forget();

    // A copy of the name that stays where it is for the life of the process: records share it.
    const char* KeptName(const char* szName);

  private:
    using Place = std::vector<std::unique_ptr<KnownTable>>::iterator;

    // Where the table of that name is, or would be.
    Place PlaceOf(const std::string& strName);

    std::vector<std::unique_ptr<KnownTable>> m_vecTables;  // by name
    KnownTable* m_pLast = nullptr;  // each operation asks several times for the same table
    Json::Value m_jNames;           // each as the text of its own member
};

// The table as every operation looks it up: recType, which learns the definition or logs why it is
// refused, with all that is known beside the types. Defined beside recType.
KnownTable& LookUpTable(const Json::Value& jTableDef, const std::string& strJsonName);

}  // namespace vornjsondb

#endif  // VORN_SCHEMA_KNOWN_TABLES_H
