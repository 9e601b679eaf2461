#include "misc/JSONArray.h"

#include <json-glib/json-glib.h>

#include "common/CLyLog.h"
#include "misc/JSONNodeHelp.h"
#include "misc/JSONObject.h"

using namespace pictavo::json;

JSONArray::JSONArray() {
  mJsonArray = json_array_new();
  WASSERT_MSG(mJsonArray != nullptr, "Failed to create JsonArray");
}

JSONArray::JSONArray(const std::string& text) {
  JsonNode* root = parseRoot(text, false);
  if (JSON_NODE_HOLDS_ARRAY(root)) {
    mJsonArray = json_array_ref(json_node_get_array(root));
  } else {
    LYLOG_E("Root node is not Array type");
  }
  json_node_free(root);
}

JSONArray::JSONArray(const std::vector<std::string>& strings) : JSONArray() {
  addStrings(strings);
}

JSONArray::JSONArray(JsonArray* array) {
  WASSERT(array != nullptr);
  mJsonArray = json_array_ref(array);
}

JSONArray::JSONArray(const JSONArray& other)
    : mJsonArray(other.mJsonArray ? json_array_ref(other.mJsonArray) : nullptr) {}

JSONArray& JSONArray::operator=(const JSONArray& other) {
  if (this != &other) {
    JsonArray* next = other.mJsonArray ? json_array_ref(other.mJsonArray) : nullptr;
    if (mJsonArray) json_array_unref(mJsonArray);
    mJsonArray = next;
  }
  return *this;
}

JSONArray::~JSONArray() {
  if (mJsonArray) json_array_unref(mJsonArray);
}

static JsonNode* element(JsonArray* array, int i) {
  if (!array || i < 0 || static_cast<guint>(i) >= json_array_get_length(array)) return nullptr;
  return json_array_get_element(array, static_cast<guint>(i));
}

int JSONArray::getLength() const {
  return mJsonArray ? static_cast<int>(json_array_get_length(mJsonArray)) : 0;
}

JSONArray* JSONArray::getArray(int i) const {
  JsonNode* node = element(mJsonArray, i);
  if (!node || !JSON_NODE_HOLDS_ARRAY(node)) return nullptr;
  return new JSONArray(json_node_get_array(node));
}

JSONObject* JSONArray::getObject(int i) const {
  JsonNode* node = element(mJsonArray, i);
  if (!node || !JSON_NODE_HOLDS_OBJECT(node)) return nullptr;
  return new JSONObject(json_node_get_object(node));
}

bool JSONArray::getBoolean(int i) const {
  return nodeBoolean(element(mJsonArray, i));
}

int JSONArray::getInt(int i) const {
  return nodeInt(element(mJsonArray, i));
}

double JSONArray::getDouble(int i) const {
  return nodeDouble(element(mJsonArray, i));
}

std::string JSONArray::getString(int i) const {
  return nodeString(element(mJsonArray, i));
}

bool JSONArray::isNull(int i) const {
  return nodeIsNull(element(mJsonArray, i));
}

void JSONArray::addArray(const JSONArray& array) {
  if (!mJsonArray || !array.mJsonArray) {
    LYLOG_E("Invalid array");
    return;
  }
  json_array_add_array_element(mJsonArray, json_array_ref(array.mJsonArray));
}

void JSONArray::addStrings(const std::vector<std::string>& strings) {
  if (!mJsonArray) {
    LYLOG_E("Invalid array");
    return;
  }
  for (const std::string& s : strings) json_array_add_string_element(mJsonArray, s.c_str());
}

void JSONArray::appendElements(JsonArray* other) {
  if (!mJsonArray || !other) {
    LYLOG_E("Invalid array");
    return;
  }
  const guint length = json_array_get_length(other);
  for (guint i = 0; i < length; ++i) {
    json_array_add_element(mJsonArray, json_node_copy(json_array_get_element(other, i)));
  }
}

std::string JSONArray::toString() const {
  if (!mJsonArray) return std::string();
  JsonNode* node = json_node_new(JSON_NODE_ARRAY);
  json_node_set_array(node, mJsonArray);
  std::string text = nodeToString(node);
  json_node_free(node);
  return text;
}
