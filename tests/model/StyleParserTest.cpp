#include <gtest/gtest.h>

#include <memory>
#include <stdexcept>

#include "common/CLyFloatRectangle.h"
#include "misc/JSONObject.h"
#include "model/style/CLyGridHandlerInfo.h"
#include "model/style/CLyGridImageInfo.h"
#include "model/style/CLyGridImageLayoutInfo.h"
#include "tests/support/TestSupport.h"

using pictavo::test::LogCapture;

namespace {

const char* kHandler = R"({"x": 1, "y": 0.5, "base_image_id": 0, "direction": "R",
  "h_variation": [[0, 1], [1, -1]], "v_variation": [[0, 0], [0, 0]], "image_count": 2})";

std::string handlerWith(const std::string& direction, const std::string& hv, int imageCount = 2) {
  return R"({"x": 0, "y": 0, "base_image_id": 0, "direction": ")" + direction + R"(", "h_variation": )" + hv +
         R"(, "v_variation": [[0, 0]], "image_count": )" + std::to_string(imageCount) + "}";
}

}  // namespace

TEST(StyleParser, HandlerReadsPositionDirectionAndVariation) {
  JSONObject object{std::string(kHandler)};
  CLyGridHandlerInfo handler(&object);
  float x = 0, y = 0;
  int base = -1;
  ASSERT_TRUE(handler.getPostion(&x, &y, &base));
  EXPECT_FLOAT_EQ(x, 1.0f);
  EXPECT_FLOAT_EQ(y, 0.5f);
  EXPECT_EQ(base, 0);
  EXPECT_EQ(handler.getDirection(), 1);
  CLyFloatRectangle v;
  handler.getImageVariation(1, 0.1f, 0.3f, &v);
  EXPECT_FLOAT_EQ(v.x1, 0.1f);
  EXPECT_FLOAT_EQ(v.x2, -0.1f);
  EXPECT_FLOAT_EQ(v.y1, 0.0f);  // no D flag: -1 x 0

  LogCapture capture;
  CLyFloatRectangle untouched(9, 9, 9, 9);
  handler.getImageVariation(2, 0.1f, 0.1f, &untouched);
  EXPECT_TRUE(capture.contains("nImageIndex(2) is incorrect!"));
  EXPECT_FLOAT_EQ(untouched.x1, 9.0f);
  handler.getImageVariation(-1, 0.1f, 0.1f, &untouched);
  EXPECT_FLOAT_EQ(untouched.x1, 9.0f);
  handler.getImageVariation(0, 0.1f, 0.1f, nullptr);
  EXPECT_TRUE(capture.contains("p_rectVariation is nullptr!"));
  EXPECT_FALSE(handler.getPostion(&x, nullptr, &base));
  EXPECT_TRUE(capture.contains("x = "));
}

TEST(StyleParser, DirectionsMapToFlagsExactly) {
  const struct {
    const char* text;
    int flags;
  } cases[] = {{"R", 1},  {"L", 2},  {"U", 4},  {"D", 8},   {"UR", 5},  {"RU", 5}, {"RD", 9},
               {"DR", 9}, {"LU", 6}, {"UL", 6}, {"LD", 10}, {"DL", 10}, {"ru", 0}, {"RL", 0}};
  for (const auto& c : cases) {
    JSONObject object{handlerWith(c.text, "[[1, 1]]")};
    LogCapture capture;
    CLyGridHandlerInfo handler(&object);
    EXPECT_EQ(handler.getDirection(), c.flags) << c.text;
    EXPECT_EQ(capture.contains("Failed to get direction"), c.flags == 0) << c.text;
  }
  // "L" negates the factors: a drag of 0.1 shifts left by -0.1 and shrinks by 0.1.
  JSONObject object{handlerWith("L", "[[1, 1]]", 1)};
  CLyGridHandlerInfo left(&object);
  CLyFloatRectangle v;
  left.getImageVariation(0, 0.1f, 0.0f, &v);
  EXPECT_FLOAT_EQ(v.x1, -0.1f);
  EXPECT_FLOAT_EQ(v.x2, -0.1f);
}

TEST(StyleParser, MalformedHandlersThrowWithTheirLog) {
  const struct {
    std::string json;
    const char* log;
  } cases[] = {
      {R"({"v_variation": [], "image_count": 1})", "hVariation is null! pArray is nullptr!"},
      {R"({"h_variation": [], "image_count": 1})", "hVariation is null! pArray is nullptr!"},
      {R"({"h_variation": [1], "v_variation": [], "image_count": 1})", "pArray2 is nullptr!"},
      {R"({"h_variation": [[0,0],[0,0],[0,0],[0,0],[0,0],[0,0],[0,0]], "v_variation": [], "image_count": 1})",
       "h_variation has 7 entries"},
      {R"({"h_variation": [], "v_variation": [], "image_count": 7})", "image_count(7) is invalid!"},
      {R"({"h_variation": [[1e300, 0]], "v_variation": [], "image_count": 1})", "is not a usable number"},
  };
  for (const auto& c : cases) {
    LogCapture capture;
    JSONObject object{c.json};
    EXPECT_THROW(CLyGridHandlerInfo handler(&object), std::exception) << c.json;
    EXPECT_TRUE(capture.contains(c.log)) << c.json;
  }
  LogCapture capture;
  EXPECT_THROW(CLyGridHandlerInfo(nullptr), std::exception);
  EXPECT_TRUE(capture.contains("object is nullptr!"));
  // Extra numbers in a pair are ignored; missing ones are 0.
  JSONObject object{handlerWith("R", "[[0.5, 2, 99], [3]]")};
  CLyGridHandlerInfo handler(&object);
  CLyFloatRectangle v;
  handler.getImageVariation(1, 1.0f, 0.0f, &v);
  EXPECT_FLOAT_EQ(v.x1, 3.0f);
  EXPECT_FLOAT_EQ(v.x2, 0.0f);
}

TEST(StyleParser, CellsAndLayouts) {
  JSONObject cellObject{R"({"rect": [0.25, 0.5], "min_width": 0.14, "min_height": 0.2,
                           "handlers": [)" +
                        std::string(kHandler) + "]}"};
  CLyGridImageInfo cell(&cellObject);
  float rect[4] = {9, 9, 9, 9};
  ASSERT_TRUE(cell.getDrawRect(rect));
  EXPECT_FLOAT_EQ(rect[0], 0.25f);
  EXPECT_FLOAT_EQ(rect[1], 0.5f);
  EXPECT_FLOAT_EQ(rect[2], 0.0f);
  EXPECT_FLOAT_EQ(rect[3], 0.0f);
  EXPECT_FLOAT_EQ(cell.getMinHeight(), 0.2f);
  EXPECT_EQ(cell.getHandlerCount(), 1);
  LogCapture capture;
  EXPECT_EQ(cell.getHandlerInfo(1), nullptr);
  EXPECT_TRUE(capture.contains("nIndex(1) is bigger and equal than size(1)"));
  EXPECT_FALSE(cell.getDrawRect(nullptr));
  EXPECT_TRUE(capture.contains("rect is nullptr"));

  JSONObject emptyLayout{std::string(R"({"images": []})")};
  CLyGridImageLayoutInfo layout(&emptyLayout);
  EXPECT_EQ(layout.getImageCount(), 0);
  EXPECT_EQ(layout.getImageInfo(0), nullptr);
  EXPECT_FALSE(layout.getDrawRects(nullptr));
  EXPECT_TRUE(capture.contains("returnPreset is null"));
}

TEST(StyleParser, MalformedCellsAndLayoutsThrowWithTheirLog) {
  const std::string cell = R"({"rect": [0, 0, 1, 1], "handlers": []})";
  const struct {
    std::string json;
    bool layout;
    const char* log;
  } cases[] = {
      {R"({"handlers": []})", false, "pArray is nullptr!"},
      {R"({"rect": [0, 0, 1, 1]})", false, "pArray is nullptr!"},
      {R"({"rect": [0, 0, 1, 1], "handlers": [3]})", false, "__obj is nullptr!"},
      {R"({"rect": [0, 0, 1, 1], "handlers": [{}]})", false, "hVariation is null! pArray is nullptr!"},
      {R"({})", true, "pArray is nullptr!"},
      {R"({"images": [1]})", true, "__obj is nullptr!"},
      {R"({"images": [)" + cell + "," + cell + "," + cell + "," + cell + "," + cell + "," + cell + "," +
           cell + "]}",
       true, "images count(7) is bigger than 6"},
      {R"({"images": [{"rect": [0,0,1,1], "handlers": [{"base_image_id": 3, "h_variation": [],
          "v_variation": [], "image_count": 1}]}]})",
       true, "base_image_id(3) is not a cell of 1 images"},
  };
  for (const auto& c : cases) {
    LogCapture capture;
    JSONObject object{c.json};
    if (c.layout) {
      EXPECT_THROW(CLyGridImageLayoutInfo layout(&object), std::exception) << c.json;
    } else {
      EXPECT_THROW(CLyGridImageInfo info(&object), std::exception) << c.json;
    }
    EXPECT_TRUE(capture.contains(c.log)) << c.json;
  }
  EXPECT_THROW(CLyGridImageInfo(nullptr), std::exception);
  EXPECT_THROW(CLyGridImageLayoutInfo(nullptr), std::exception);
}
