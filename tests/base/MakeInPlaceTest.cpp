#include <gtest/gtest.h>

#include "../../src/base/JsonMemory.h"

namespace {

// JsonCpp refuses to make a text of a null pointer, when the value calls itself a text already.
TEST(MakeInPlaceTest, ValueThatCannotBeMadeLeavesNull) {
    const char* volatile szNone = nullptr;
    Json::Value jValue;
    EXPECT_THROW(vornjsondb::MakeInPlace(jValue, [&] { return Json::Value(szNone); }),
                 Json::Exception);
    EXPECT_EQ(Json::nullValue, jValue.type());
    vornjsondb::MakeInPlace(jValue, [] { return Json::Value("a text"); });
    EXPECT_EQ("a text", jValue.asString());
}

}  // namespace
