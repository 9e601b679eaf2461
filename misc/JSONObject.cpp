#include "misc/JSONObject.h"

#include <json-glib/json-glib.h>

#include "common/CLyLog.h"
#include "misc/JSONArray.h"
#include "misc/JSONNodeHelp.h"

using namespace pictavo::json;

JSONObject::JSONObject() {
  mJson = json_object_new();
  WASSERT_MSG(mJson != nullptr, "Failed to create JsonObject");
}

JSONObject::JSONObject(const std::string& text) {
  _adoptParsedRoot(parseRoot(text, false));
}

JSONObject::JSONObject(const std::string& path, bool /*fromFile*/) {
  _adoptParsedRoot(parseRoot(path, true));
}

JSONObject::JSONObject(JsonObject* object) {
  WASSERT(object != nullptr);
  mJson = json_object_ref(object);
}

JSONObject::JSONObject(const JSONObject& other)
    : mJson(other.mJson ? json_object_ref(other.mJson) : nullptr) {}

JSONObject& JSONObject::operator=(const JSONObject& other) {
  if (this != &other) {
    JsonObject* next = other.mJson ? json_object_ref(other.mJson) : nullptr;
    if (mJson) json_object_unref(mJson);
    mJson = next;
  }
  return *this;
}

JSONObject::~JSONObject() {
  if (mJson) json_object_unref(mJson);
}

void JSONObject::_adoptParsedRoot(void* node) {
  JsonNode* root = static_cast<JsonNode*>(node);
  if (JSON_NODE_HOLDS_OBJECT(root)) {
    mJson = json_object_ref(json_node_get_object(root));
  } else {
    LYLOG_E("Root node is not Object type");
  }
  json_node_free(root);
}

static JsonNode* member(JsonObject* object, const std::string& name) {
  if (!object) return nullptr;
  return json_object_get_member(object, name.c_str());
}

bool JSONObject::hasMember(const std::string& name) const {
  return mJson && json_object_has_member(mJson, name.c_str());
}

JSONArray* JSONObject::getArray(const std::string& name) const {
  JsonNode* node = member(mJson, name);
  if (!node || !JSON_NODE_HOLDS_ARRAY(node)) return nullptr;
  return new JSONArray(json_node_get_array(node));
}

JSONObject* JSONObject::getObject(const std::string& name) const {
  JsonNode* node = member(mJson, name);
  if (!node || !JSON_NODE_HOLDS_OBJECT(node)) return nullptr;
  return new JSONObject(json_node_get_object(node));
}

bool JSONObject::getBoolean(const std::string& name) const {
  return nodeBoolean(member(mJson, name));
}

int JSONObject::getInt(const std::string& name) const {
  return nodeInt(member(mJson, name));
}

double JSONObject::getDouble(const std::string& name) const {
  return nodeDouble(member(mJson, name));
}

std::string JSONObject::getString(const std::string& name) const {
  return nodeString(member(mJson, name));
}

bool JSONObject::isNull(const std::string& name) const {
  return nodeIsNull(member(mJson, name));
}

void JSONObject::setArray(const std::string& name, const JSONArray& array) {
  if (!mJson || !array.getJsonArray()) {
    LYLOG_E("Invalid object or array");
    return;
  }
  json_object_set_array_member(mJson, name.c_str(), json_array_ref(array.getJsonArray()));
}

std::string JSONObject::toString() const {
  if (!mJson) return std::string();
  JsonNode* node = json_node_new(JSON_NODE_OBJECT);
  json_node_set_object(node, mJson);
  std::string text = nodeToString(node);
  json_node_free(node);
  return text;
}

std::vector<std::string> JSONObject::getMemberNames() const {
  std::vector<std::string> names;
  if (!mJson) return names;
  GList* members = json_object_get_members(mJson);
  for (GList* it = members; it; it = it->next) names.emplace_back(static_cast<const char*>(it->data));
  g_list_free(members);
  return names;
}
