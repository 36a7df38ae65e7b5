// JsonCpp's texts come from malloc. Under AddressSanitizer, which brings its own, this is left out.

#ifndef __SANITIZE_ADDRESS__

#include <VornJsonDbApi.h>

#include <cstddef>
#include <cstdlib>
#include <functional>
#include <new>
#include <string>

#include <gtest/gtest.h>

#include "../support/TableTest.h"

using namespace testhost;

extern "C" void* __libc_malloc(size_t nBytes);

namespace {

// 0: never. Counts down to the one allocation that fails.
int g_nFailAt = 0;

}  // namespace

extern "C" void* malloc(size_t nBytes) {
    if (g_nFailAt > 0 && --g_nFailAt == 0) {
        return nullptr;
    }
    return __libc_malloc(nBytes);
}

// By way of malloc also where the system's own does something else, as under valgrind.
void* operator new(size_t nBytes) {
    if (void* pMemory = malloc(nBytes)) {
        return pMemory;
    }
    throw std::bad_alloc();
}
void operator delete(void* pMemory) noexcept {
    free(pMemory);
}
void operator delete(void* pMemory, size_t) noexcept {
    free(pMemory);
}

namespace {

class JsonMemoryTest : public TableTest {
  protected:
    // The member of the one row that the callback makes of the text, once it has memory for it.
    Json::Value ReadWhileMemoryFails(std::string strMember, std::string strText);

    // Runs the call while each of its allocations fails in turn, until none does. Returns how
    // often it threw; any exception but std::bad_alloc fails the test.
    static int ThrowsOutOf(const std::function<void()>& Call) {
        int nThrown = 0;
        for (int nAt = 1; nAt < 10000; ++nAt) {
            g_nFailAt = nAt;
            bool blThrown = false;
            std::string strOther;
            try {
                Call();
            } catch (const std::bad_alloc&) {
                blThrown = true;
            } catch (const std::logic_error&) {
                blThrown = true;  // SQLite's formatter had no memory
            } catch (const std::exception& Error) {
                strOther = Error.what();
            }
            const bool blUntouched = g_nFailAt > 0;
            g_nFailAt = 0;
            EXPECT_EQ(strOther, "") << "allocation " << nAt;
            nThrown += static_cast<int>(blThrown);
            if (blUntouched) {
                return nThrown;
            }
        }
        ADD_FAILURE() << "the call never passed";
        return nThrown;
    }

    const std::string m_strLong = std::string(100, 'x');
};

TEST_F(JsonMemoryTest, ConstructorThrowsBadAllocOnly) {
    std::string strName = "t";
    std::string strCreate = "SELECT 1";
    EXPECT_GT(ThrowsOutOf([&] { VornJsonDbApi Handle(m_pDb, strName, m_jDefinition, strCreate); }),
              0);
}

TEST_F(JsonMemoryTest, FirstTypeLookupThrowsBadAllocOnly) {
    std::string strName = "t";
    EXPECT_GT(ThrowsOutOf([&] { VORN_JSON_DB::recType(m_jDefinition, strName); }), 0);
}

TEST_F(JsonMemoryTest, MemberCopyThrowsBadAllocOnly) {
    Json::Value jSource;
    jSource["name"] = m_strLong;
    EXPECT_GT(ThrowsOutOf([&] {
                  Json::Value jCopy;
                  VORN_JSON_DB::jsonCopyMember(jCopy, jSource, true);
              }),
              0);
}

TEST_F(JsonMemoryTest, DefaultsThrowBadAllocOnly) {
    m_jDefinition["t"]["member"]["name"]["cppDefaultValue"] = m_strLong;
    OpenDefinition(m_jDefinition, kCreateItem);
    Json::Value jFirst;  // The types are looked up, so that only the defaults ask for memory.
    EXPECT_EQ(m_pHandle->fillDefaultValue(jFirst, false), 0);
    EXPECT_GT(ThrowsOutOf([&] {
                  Json::Value jRecord;
                  m_pHandle->fillDefaultValue(jRecord, false);
              }),
              0);
    Json::Value jRecord;
    jRecord["id"] = 1;
    EXPECT_GT(ThrowsOutOf([&] {
                  Json::Value jStored;
                  m_pHandle->recCreate(jRecord, jStored);
              }),
              0);
}

TEST_F(JsonMemoryTest, UpdateWithAFilterInTheRecordThrowsBadAllocOnly) {
    Json::Value jRecord;
    jRecord["name"] = m_strLong;
    jRecord["vornSqlWhereFilter"] = "1";
    std::string strWhere = "id = 1";
    EXPECT_GT(ThrowsOutOf([&] { m_pHandle->recUpdateByWhere(jRecord, strWhere); }), 0);
}

TEST_F(JsonMemoryTest, DeleteByNameThrowsBadAllocOnly) {
    std::string strValue = m_strLong;
    EXPECT_GT(ThrowsOutOf([&] { m_pHandle->recDeleteByName(strValue, "name"); }), 0);
}

Json::Value JsonMemoryTest::ReadWhileMemoryFails(std::string strMember, std::string strText) {
    Listed();
    const RowCallback fnCallback = LastRowCallback();
    char* aszNames[] = {strMember.data()};
    char* aszTexts[] = {strText.data()};
    Json::Value jRows(Json::arrayValue);
    int nRefused = 0;
    int nResult = -1;
    for (int nAt = 1; nResult != 0 && nAt < 1000; ++nAt) {
        g_nFailAt = nAt;
        nResult = fnCallback(&jRows, 1, aszTexts, aszNames);
        g_nFailAt = 0;
        if (nResult != 0) {
            ++nRefused;
            EXPECT_EQ(nResult, -1);
            EXPECT_EQ(jRows.size(), 0U);
            EXPECT_EQ(TakeLog(), Lines{Check(kRowFailed)});
        }
    }
    EXPECT_GT(nRefused, 0);
    return jRows[0][strMember];
}

TEST_F(JsonMemoryTest, RowWithoutMemoryIsRefusedWithOneLine) {
    EXPECT_EQ(ReadWhileMemoryFails("name", m_strLong), Json::Value(m_strLong));
}

TEST_F(JsonMemoryTest, JsonTextWithoutMemoryIsRefusedLikeAnyOther) {
    Open("j:Json::Value");
    // At first memory fails while the reader is made, then while it reads.
    for (int i = 0; i < 2; ++i) {
        const Json::Value jRead = ReadWhileMemoryFails("j", "[\"\\t" + m_strLong + "\"]");
        EXPECT_EQ(jRead[0], Json::Value("\t" + m_strLong));
    }
}

TEST_F(JsonMemoryTest, WrittenTextIsWholeOrNotThere) {
    Json::Value jQuery;
    jQuery["limit"] = "\t" + m_strLong;
    std::string strFirst;  // The writer is made.
    EXPECT_EQ(m_pHandle->SqlFilterConditionFromJson(jQuery, strFirst), 0);
    EXPECT_GT(ThrowsOutOf([&] {
                  std::string strSql;
                  m_pHandle->SqlFilterConditionFromJson(jQuery, strSql);
                  EXPECT_EQ(strSql, " LIMIT \"\\t" + m_strLong + '"');
              }),
              0);
}

TEST_F(JsonMemoryTest, SortedListAndGetThrowBadAllocOnly) {
    Sql("INSERT INTO t VALUES (1, 'a name that is not short')");
    Json::Value jQuery;
    jQuery["sort_by"] = "name";
    jQuery["sort_direction"] = "desc";
    Json::Value jFound;
    jFound["kept"] = 1;
    EXPECT_GT(ThrowsOutOf([&] { m_pHandle->recGetOne(jQuery, jFound); }), 0);
}

}  // namespace

#endif  // __SANITIZE_ADDRESS__
