#include <gtest/gtest.h>

#include <fstream>
#include <memory>
#include <stdexcept>

#include "misc/JSONArray.h"
#include "misc/JSONObject.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;
using pictavo::test::TempDir;

TEST(JSON, ObjectLookups) {
  JSONObject o(std::string(R"({"i": 1, "d": 0.0, "f": 2.5, "s": "text", "b": true, "n": null,
                               "a": [1, "x", {"k": 3}], "o": {"k": "v"}})"));
  EXPECT_DOUBLE_EQ(o.getDouble("i"), 1.0);
  EXPECT_DOUBLE_EQ(o.getDouble("d"), 0.0);
  EXPECT_DOUBLE_EQ(o.getDouble("f"), 2.5);
  EXPECT_EQ(o.getInt("i"), 1);
  EXPECT_EQ(o.getString("s"), "text");
  EXPECT_EQ(o.getString("missing"), "");
  EXPECT_EQ(o.getString("i"), "");
  EXPECT_TRUE(o.getBoolean("b"));
  EXPECT_TRUE(o.isNull("n"));
  EXPECT_FALSE(o.isNull("i"));
  EXPECT_TRUE(o.hasMember("a"));
  EXPECT_FALSE(o.hasMember("z"));
  EXPECT_EQ(o.getArray("s"), nullptr);
  EXPECT_EQ(o.getObject("a"), nullptr);
  EXPECT_EQ(o.getInt("missing"), 0);

  std::unique_ptr<JSONArray> a(o.getArray("a"));
  ASSERT_TRUE(a);
  EXPECT_EQ(a->getLength(), 3);
  EXPECT_EQ(a->getInt(0), 1);
  EXPECT_DOUBLE_EQ(a->getDouble(0), 1.0);
  EXPECT_EQ(a->getString(1), "x");
  EXPECT_EQ(a->getString(0), "");
  std::unique_ptr<JSONObject> inner(a->getObject(2));
  ASSERT_TRUE(inner);
  EXPECT_EQ(inner->getInt("k"), 3);
  // Out-of-range indexes answer the empty result.
  EXPECT_EQ(a->getInt(3), 0);
  EXPECT_EQ(a->getInt(-1), 0);
  EXPECT_EQ(a->getObject(7), nullptr);
  std::unique_ptr<JSONObject> child(o.getObject("o"));
  ASSERT_TRUE(child);
  EXPECT_EQ(child->getString("k"), "v");
}

TEST(JSON, ParseFailuresThrowAndWrongRootIsEmpty) {
  LogCapture capture;
  EXPECT_THROW(JSONObject(std::string("{bad")), std::exception);
  EXPECT_TRUE(capture.contains("error = "));
  capture.clear();
  // An empty document fails like a parse error.
  EXPECT_THROW(JSONObject(std::string("")), std::exception);
  EXPECT_THROW(JSONObject(std::string("   ")), std::exception);
  EXPECT_THROW(JSONArray(std::string("")), std::exception);
  EXPECT_TRUE(capture.contains("error = ") ||
              capture.contains("WASSERT! Let success parse, It must be success."));

  capture.clear();
  JSONObject notObject(std::string("[1, 2]"));
  EXPECT_TRUE(capture.contains("Root node is not Object type"));
  EXPECT_EQ(notObject.getInt("x"), 0);
  EXPECT_EQ(notObject.getString("x"), "");
  EXPECT_EQ(notObject.getArray("x"), nullptr);
  EXPECT_FALSE(notObject.hasMember("x"));
  EXPECT_EQ(notObject.toString(), "");
  JSONArray notArray(std::string("{}"));
  EXPECT_TRUE(capture.contains("Root node is not Array type"));
  EXPECT_EQ(notArray.getLength(), 0);
}

TEST(JSON, FilesParseAndMissingFilesThrow) {
  TempDir dir;
  {
    std::ofstream(dir.file("a.json")) << R"({"layouts": [1]})";
    std::ofstream(dir.file("root-array.json")) << "[{}]";
    std::ofstream(dir.file("empty.json")) << "";
  }
  JSONObject ok(dir.file("a.json"), true);
  std::unique_ptr<JSONArray> layouts(ok.getArray("layouts"));
  ASSERT_TRUE(layouts);
  EXPECT_EQ(layouts->getLength(), 1);
  JSONObject rootArray(dir.file("root-array.json"), true);
  EXPECT_EQ(rootArray.getArray("layouts"), nullptr);
  EXPECT_THROW(JSONObject(dir.file("empty.json"), true), std::exception);
  EXPECT_THROW(JSONObject(dir.file("missing.json"), true), std::exception);
}

TEST(JSON, BuildersShareAndSerialise) {
  JSONArray strings(std::vector<std::string>{"a", "b"});
  EXPECT_EQ(strings.toString(), R"(["a","b"])");
  JSONObject object;
  object.setArray("list", strings);
  // The array is shared, not copied: later additions show in the object.
  strings.addStrings({"c"});
  EXPECT_EQ(object.toString(), R"({"list":["a","b","c"]})");
  EXPECT_EQ(object.getMemberNames(), std::vector<std::string>{"list"});

  JSONArray outer;
  outer.addArray(strings);
  EXPECT_EQ(outer.toString(), R"([["a","b","c"]])");
  JSONArray copy;
  copy.appendElements(strings.getJsonArray());
  strings.addStrings({"d"});
  EXPECT_EQ(copy.toString(), R"(["a","b","c"])");

  JSONArray parsed(std::string(R"([1, 2.5, null])"));
  EXPECT_DOUBLE_EQ(parsed.getDouble(1), 2.5);
  EXPECT_TRUE(parsed.isNull(2));
  EXPECT_EQ(parsed.getString(2), "");

  // Copies hold their own reference.
  JSONObject* heap = new JSONObject(std::string(R"({"k": 5})"));
  JSONObject kept(*heap);
  delete heap;
  EXPECT_EQ(kept.getInt("k"), 5);
}

TEST(JSON, WrappingNullAsserts) {
  LogCapture capture;
  EXPECT_THROW(JSONObject(static_cast<JsonObject*>(nullptr)), pictavo::test::AssertionFired);
  EXPECT_TRUE(capture.contains("WASSERT! object != nullptr"));
  EXPECT_THROW(JSONArray(static_cast<JsonArray*>(nullptr)), pictavo::test::AssertionFired);
  EXPECT_TRUE(capture.contains("WASSERT! array != nullptr"));
}
