#pragma once
// Value readers shared by the JSON wrappers. They accept a null or non-value
// node and answer the empty result, so a lookup never reaches json-glib's
// precondition checks.

#include <json-glib/json-glib.h>

#include <string>

namespace pictavo::json {

inline bool isValue(JsonNode* node) {
  return node != nullptr && JSON_NODE_TYPE(node) == JSON_NODE_VALUE;
}

inline bool nodeBoolean(JsonNode* node) {
  return isValue(node) ? json_node_get_boolean(node) : false;
}

inline int nodeInt(JsonNode* node) {
  return isValue(node) ? static_cast<int>(json_node_get_int(node)) : 0;
}

// Integer-written numbers read as 0.0 on some json-glib versions; read them
// again as integers.
inline double nodeDouble(JsonNode* node) {
  if (!isValue(node)) return 0.0;
  double value = json_node_get_double(node);
  if (value == 0.0) value = static_cast<double>(json_node_get_int(node));
  return value;
}

inline std::string nodeString(JsonNode* node) {
  if (!isValue(node) || json_node_get_value_type(node) != G_TYPE_STRING) return std::string();
  const char* text = json_node_get_string(node);
  return text ? std::string(text) : std::string();
}

inline bool nodeIsNull(JsonNode* node) {
  return node != nullptr && JSON_NODE_HOLDS_NULL(node);
}

// Compact text of a node; empty on failure.
inline std::string nodeToString(JsonNode* node) {
  JsonGenerator* generator = json_generator_new();
  if (!generator) return std::string();
  json_generator_set_pretty(generator, FALSE);
  json_generator_set_root(generator, node);
  gchar* text = json_generator_to_data(generator, nullptr);
  std::string result = text ? text : "";
  g_free(text);
  g_object_unref(generator);
  return result;
}

// Parses text (or the file at `path` when fromFile) and returns the root
// node (a copy the caller frees). Logs and throws on a parse error or an
// empty document.
JsonNode* parseRoot(const std::string& textOrPath, bool fromFile);

}  // namespace pictavo::json
