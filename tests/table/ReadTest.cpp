// Reading what a query selects: records, rows, numbers.

#include <stdexcept>

#include "TableFixture.h"

namespace VORN_JSON_DB {

namespace {

class ReadTest : public TableTest {
  protected:
    ReadTest() {
        Open();
        Run("INSERT INTO task (id, name, size, done, tags) VALUES (1, 'b', 10, 1, '[1]'), "
            "(2, 'a', NULL, 0, NULL), (3, NULL, 30, NULL, '[]')");
    }

    std::string List(const std::string& strQuery) {
        Json::Value jRecords = "as it was";
        const Status Outcome = m_Table.List(Parse(strQuery), jRecords);
        return Outcome.Ok() ? Text(jRecords) : Text(Outcome) + " " + Text(jRecords);
    }
    std::string First(const std::string& strQuery) {
        Json::Value jRecord = "as it was";
        const Status Outcome = m_Table.First(Parse(strQuery), jRecord);
        return Outcome.Ok() ? Text(jRecord) : Text(Outcome) + " " + Text(jRecord);
    }
    std::int64_t Count(const std::string& strQuery) {
        std::int64_t nRecords = -1;
        EXPECT_EQ("ok", Text(m_Table.Count(Parse(strQuery), nRecords)));
        return nRecords;
    }
    bool Exists(const std::string& strQuery) {
        bool blExists = false;
        EXPECT_EQ("ok", Text(m_Table.Exists(Parse(strQuery), blExists)));
        return blExists;
    }
};

TEST_F(ReadTest, FirstAndListReadWhatTheQuerySelects) {
    EXPECT_EQ(R"([{"done":true,"id":1,"name":"b","size":10,"tags":[1]},)"
              R"({"done":false,"id":2,"name":"a"},{"id":3,"size":30,"tags":[]}])",
              List("{}"));
    EXPECT_EQ(R"([{"id":3},{"id":2,"name":"a"},{"id":1,"name":"b"}])",
              List(R"({"sort": ["name"], "members": ["name", "id"]})"));
    EXPECT_EQ(R"([{"name":"b"},{"name":"a"},{}])", List(R"({"members": ["name"]})"));
    EXPECT_EQ("[]", List(R"({"where": {"id": 4}})"));
    EXPECT_EQ(R"([{"id":3,"size":30,"tags":[]}])", List(R"({"offset": 2, "sort": ["id"]})"));
    EXPECT_EQ(R"({"id":3,"size":30,"tags":[]})", First(R"({"sort": ["-id"]})"));
    EXPECT_EQ(R"({"size":10})", First(R"({"where": {"id": 1}, "members": ["size"]})"));
}

TEST_F(ReadTest, OutputsAreAsTheyWereAfterAFailure) {
    EXPECT_EQ(
        "not-found: cannot get a record from table \"task\": the query selects none "
        "\"as it was\"",
        First(R"({"where": {"id": 4}})"));
    const std::string strUnknown =
        "table \"task\": table \"task\" has no member \"nmae\" (did you mean \"name\"?) "
        "[unknown-member /where/nmae]";
    EXPECT_EQ("refused: cannot list records of " + strUnknown + " \"as it was\"",
              List(R"({"where": {"nmae": 4}})"));
    std::int64_t nRecords = 7;
    EXPECT_EQ("refused: cannot count records of " + strUnknown,
              Text(m_Table.Count(Query().Where("nmae", 1), nRecords)));
    EXPECT_EQ(7, nRecords);
    bool blExists = true;
    EXPECT_EQ("refused: cannot look for records of " + strUnknown,
              Text(m_Table.Exists(Query().Where("nmae", 1), blExists)));
    EXPECT_TRUE(blExists);
    Run("DROP TABLE task");
    EXPECT_EQ("refused: cannot list records of table \"task\": no such table: task \"as it was\"",
              List("{}"));
}

TEST_F(ReadTest, CountAndExistsLookAtConditionsAndPages) {
    EXPECT_EQ(3, Count("{}"));
    EXPECT_EQ(2, Count(R"({"where": {"size": {"$ne": null}}})"));
    EXPECT_EQ(1, Count(R"({"limit": 5, "offset": 2, "sort": ["name"]})"));
    EXPECT_EQ(2, Count(R"({"limit": 2})"));
    EXPECT_EQ(0, Count(R"({"limit": 0})"));
    EXPECT_TRUE(Exists("{}"));
    EXPECT_TRUE(Exists(R"({"offset": 2})"));
    EXPECT_FALSE(Exists(R"({"offset": 3})"));
    EXPECT_FALSE(Exists(R"({"where": {"name": "c"}})"));
}

TEST_F(ReadTest, NullsAreReadAsTold) {
    const char* const szNulls = R"({"n": {"key": "id", "member": {"id": {"cpptype": "int"},
        "seen": {"cpptype": "string", "nullSeen": true}, "other": {"cpptype": "string"}}}})";
    Run("CREATE TABLE n (id INTEGER PRIMARY KEY, seen TEXT, other TEXT)");
    Run("INSERT INTO n (id) VALUES (1)");
    const char* const kRead[] = {R"([{"id":1,"seen":null}])", R"([{"id":1}])",
                                 R"([{"id":1,"other":null,"seen":null}])"};
    for (const Nulls eNulls : {Nulls::kAsDefined, Nulls::kLeaveOut, Nulls::kKeep}) {
        Options How;
        How.eNulls = eNulls;
        Open(szNulls, How);
        EXPECT_EQ(kRead[static_cast<size_t>(eNulls)], List("{}"));
    }
    EXPECT_EQ(R"([{"other":null}])", List(R"({"members": ["other"]})"));
}

// JSON text that another program wrote is no NULL.
TEST_F(ReadTest, TextOfANullIsNotLeftOut) {
    Run("UPDATE task SET tags = 'null', size = NULL WHERE id = 1");
    EXPECT_EQ(R"([{"id":1,"tags":null}])",
              List(R"({"where": {"id": 1}, "members": ["id", "size", "tags"]})"));
}

TEST_F(ReadTest, ForEachGoesOnUntilTheCallbackStops) {
    std::string strSeen;
    const auto fnSeen = [&](const Json::Value& jRecord) {
        strSeen += Text(jRecord["id"]);
        return strSeen.size() < 2;
    };
    EXPECT_EQ("ok", Text(m_Table.ForEach(Query(), fnSeen)));
    EXPECT_EQ("12", strSeen);
    EXPECT_EQ(
        "refused: cannot read records of table \"task\": the limit is less than 0 "
        "[bad-count /limit]",
        Text(m_Table.ForEach(Query().Limit(-2), fnSeen)));
}

TEST_F(ReadTest, CallbackMayReadButNotWrite) {
    const std::string strReading = " table \"task\": a callback is reading from it";
    int nRows = 0;
    const auto fnInside = [&] {
        Json::Value jRecord;
        EXPECT_EQ("ok", Text(m_Table.Get(2, jRecord)));
        EXPECT_EQ(3, Count("{}"));
        EXPECT_EQ("ok", Text(m_Table.ForEach(Query(), [&](const Json::Value&) {
                      ++nRows;
                      return true;
                  })));
        EXPECT_EQ("misuse: cannot save a record in" + strReading,
                  Text(m_Table.Create(Parse(R"({"id": 9})"))));
        EXPECT_EQ("misuse: cannot save a record in" + strReading,
                  Text(m_Table.Save(Parse(R"({"id": 9})"), OnDuplicate::kUpsert)));
        EXPECT_EQ("misuse: cannot update records of" + strReading,
                  Text(m_Table.Update(Query().Where("id", 1), Parse(R"({"size": 9})"))));
        EXPECT_EQ("misuse: cannot remove records from" + strReading,
                  Text(m_Table.Remove(Query().Where("id", 1))));
        EXPECT_EQ("misuse: cannot remove all records from" + strReading, Text(m_Table.RemoveAll()));
        EXPECT_EQ("misuse: cannot open anew" + strReading,
                  Text(m_Table.Open(m_pDb, "task", Json::Value())));
        return true;
    };
    EXPECT_EQ("ok", Text(m_Table.ForEach(Query(), [&](const Json::Value&) { return fnInside(); })));
    EXPECT_EQ("ok", Text(m_Table.ForEachRow(Query(), [&](const Row&) { return fnInside(); })));
    EXPECT_EQ(18, nRows);
    EXPECT_EQ("ok", Text(m_Table.RemoveAll()));
}

TEST_F(ReadTest, WhatACallbackThrowsLeavesTheTableUsable) {
    const auto fnThrows = [](const auto&) -> bool { throw std::runtime_error("mine"); };
    EXPECT_THROW(m_Table.ForEach(Query(), fnThrows).Ignore(), std::runtime_error);
    EXPECT_THROW(m_Table.ForEachRow(Query(), fnThrows).Ignore(), std::runtime_error);
    Run("DROP TABLE task");
}

TEST_F(ReadTest, InterruptIsToldAfterTheRowsBeforeIt) {
    Run("WITH RECURSIVE n(i) AS (SELECT 4 UNION ALL SELECT i + 1 FROM n WHERE i < 5000) "
        "INSERT INTO task (id) SELECT i FROM n");
    int nRows = 0;
    EXPECT_EQ("interrupted: cannot read records of table \"task\": interrupted",
              Text(m_Table.ForEach(Query(), [&](const Json::Value&) {
                  if (++nRows == 2) {
                      sqlite3_interrupt(m_pDb);
                  }
                  return true;
              })));
    EXPECT_EQ(2, nRows);
}

// "name kind value" of each column.
std::string Shown(const Row& Now) {
    static const char* const kKinds[] = {"null", "boolean", "integer", "real",
                                         "text", "json",    "blob"};
    std::string strAll;
    for (int i = 0; i < Now.Size(); ++i) {
        strAll +=
            (i == 0 ? "" : ", ") + Now.Name(i) + " " + kKinds[static_cast<size_t>(Now.KindOf(i))];
        switch (Now.KindOf(i)) {
            case Row::Kind::kNull:
                break;
            case Row::Kind::kBoolean:
            case Row::Kind::kInteger:
                strAll += " " + std::to_string(Now.Integer(i));
                break;
            case Row::Kind::kReal:
                strAll += " " + Text(Json::Value(Now.Real(i)));
                break;
            default:
                strAll += " " + std::string(Now.Text(i));
        }
    }
    return strAll + "; ";
}

TEST_F(ReadTest, RowsHaveKindsByTheMembersTypes) {
    std::string strAll;
    const auto fnRow = [&](const Row& Now) {
        strAll += Shown(Now);
        return Now.Size() == 5;
    };
    EXPECT_EQ("ok", Text(m_Table.ForEachRow(Query(), fnRow)));
    EXPECT_EQ(
        "done boolean 1, id integer 1, name text b, size integer 10, tags json [1]; "
        "done boolean 0, id integer 2, name text a, size null, tags null; "
        "done null, id integer 3, name null, size integer 30, tags json []; ",
        strAll);
    strAll.clear();
    EXPECT_EQ("ok", Text(m_Table.ForEachRow(Query().Members({"size", "id"}), fnRow)));
    EXPECT_EQ("id integer 1, size integer 10; ", strAll);
}

TEST_F(ReadTest, ValuesThatDoNotFitTheirTypesAreReadAsWhatTheyAre) {
    Options How;
    How.blCompatible = false;
    How.strSqlCreate =
        "CREATE TABLE w (id INTEGER PRIMARY KEY, bool, int, real, text, list, json, any)";
    Open(R"({"w": {"key": "id", "member": {"id": {"cpptype": "int"}, "bool": {"cpptype": "bool"},
         "int": {"cpptype": "int"}, "real": {"cpptype": "double"}, "text": {"cpptype": "string"},
         "list": {"cpptype": "Json::arrayValue"}, "json": {"cpptype": "Json::Value"},
         "any": {"cpptype": "any"}}}})",
         How);
    Run("INSERT INTO w VALUES (1, 2, 'x', 'y', 5, '{\"a\"', 'no json', x'4142'),"
        "(2, 'true', 0.5, 3, 0.5, 7, 0.5, 1.5), (3, 1.0, x'41', x'', x'4100', x'5b5d', '5', 'z')");
    EXPECT_EQ(R"([{"any":"AB","bool":2,"id":1,"int":"x","json":"no json","list":"{\"a\"",)"
              R"("real":"y","text":"5"},{"any":1.5,"bool":"true","id":2,"int":0.5,"json":0.5,)"
              R"("list":7,"real":3.0,"text":"0.5"},{"any":"z","bool":1.0,"id":3,"int":"A",)"
              R"("json":5,"list":"[]","real":"","text":"A\u0000"}])",
              List("{}"));
    std::string strAll;
    EXPECT_EQ("ok", Text(m_Table.ForEachRow(Query(), [&](const Row& Now) {
                  strAll += Shown(Now);
                  return true;
              })));
    EXPECT_EQ(
        "any blob AB, bool integer 2, id integer 1, int text x, json json no json, list json "
        "{\"a\", real text y, text text 5; any real 1.5, bool text true, id integer 2, int "
        "real 0.5, json real 0.5, list integer 7, real real 3.0, text text 0.5; any text z, "
        "bool real 1.0, id integer 3, int blob A, json json 5, list blob [], real blob , text "
        "blob A" +
            std::string(1, '\0') + "; ",
        strAll);
}

// No double holds the first and the last one.
TEST_F(ReadTest, WholeNumberThatIsNoDoubleIsReadExactly) {
    Options How;
    How.blCompatible = false;
    How.strSqlCreate = "CREATE TABLE w (id INTEGER PRIMARY KEY, real)";
    Open(R"({"w": {"key": "id", "member": {"id": {"cpptype": "int"},
                                           "real": {"cpptype": "double"}}}})",
         How);
    Run("INSERT INTO w (real) VALUES (9007199254740993), (9007199254740994), (5),"
        " (-9223372036854775807 - 1), (9223372036854775807)");
    std::string strAll;
    EXPECT_EQ("ok", Text(m_Table.ForEachRow(Query().Members({"real"}), [&](const Row& Now) {
                  const bool blWhole = Now.KindOf(0) == Row::Kind::kInteger;
                  strAll += blWhole ? std::to_string(Now.Integer(0)) + "; " : "real; ";
                  return true;
              })));
    EXPECT_EQ("9007199254740993; real; real; real; 9223372036854775807; ", strAll);
}

TEST_F(ReadTest, KindOfABlobStaysWhenItIsRead) {
    Run("UPDATE task SET name = x'6100ff' WHERE id = 1");
    const auto fnRow = [](const Row& Now) {
        EXPECT_EQ(Now.Text(0), std::string_view("a\0\xff", 3));
        EXPECT_EQ(Now.KindOf(0), Row::Kind::kBlob);
        return true;
    };
    EXPECT_EQ(Text(m_Table.ForEachRow(Query().Where("id", 1).Members({"name"}), fnRow)), "ok");
}

// SQLite has the texts of its conditions where the query has them.
TEST_F(ReadTest, CallbackMayChangeTheQuery) {
    const std::string strName(1000, 'x');
    Run("UPDATE task SET name = '" + strName + "'");
    Query Which = Query().Where("name", strName);
    int nRows = 0;
    const auto fnChange = [&](const auto&) {
        Which = Query().Where("name", std::string(1000, 'y'));
        return ++nRows < 10;
    };
    EXPECT_EQ(Text(m_Table.ForEach(Which, fnChange)), "ok");
    EXPECT_EQ(nRows, 3);
    Which = Query().Where("name", strName);
    EXPECT_EQ(Text(m_Table.ForEachRow(Which, fnChange)), "ok");
    EXPECT_EQ(nRows, 6);
}

TEST_F(ReadTest, ClosedTableIsMisuse) {
    Table Closed;
    Json::Value jOut;
    std::int64_t nOut = 0;
    bool blOut = false;
    EXPECT_EQ("misuse: cannot get a record from: the table is not open", Text(Closed.Get(1, jOut)));
    EXPECT_EQ(StatusCode::kMisuse, Closed.First(Query(), jOut).Code());
    EXPECT_EQ(StatusCode::kMisuse, Closed.List(Query(), jOut).Code());
    EXPECT_EQ(StatusCode::kMisuse, Closed.Count(Query(), nOut).Code());
    EXPECT_EQ(StatusCode::kMisuse, Closed.Exists(Query(), blOut).Code());
    EXPECT_EQ(StatusCode::kMisuse, Closed.ForEach(Query(), nullptr).Code());
    EXPECT_EQ(StatusCode::kMisuse, Closed.ForEachRow(Query(), nullptr).Code());
}

}  // namespace

}  // namespace VORN_JSON_DB
