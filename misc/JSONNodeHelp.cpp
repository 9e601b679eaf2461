#include "misc/JSONNodeHelp.h"

#include <stdexcept>

#include "common/CLyLog.h"

namespace pictavo::json {

JsonNode* parseRoot(const std::string& textOrPath, bool fromFile) {
  JsonParser* parser = json_parser_new();
  WASSERT_MSG(parser != nullptr, "Failed to allocate parser");

  GError* error = nullptr;
  const gboolean ok = fromFile ? json_parser_load_from_file(parser, textOrPath.c_str(), &error)
                               : json_parser_load_from_data(parser, textOrPath.c_str(), -1, &error);
  if (!ok || error) {
    LYLOG_E("error = %s", error && error->message ? error->message : "unknown");
    if (error) g_error_free(error);
    g_object_unref(parser);
    throw std::runtime_error("JSON parse error");
  }

  JsonNode* root = json_parser_get_root(parser);
  if (!root) {
    // An empty document parses without error but holds nothing: treat it
    // like a parse error rather than hand out a wrapper over nothing.
    LYLOG_E("WASSERT! Let success parse, It must be success.");
    g_object_unref(parser);
    throw std::runtime_error("JSON document is empty");
  }
  JsonNode* copy = json_node_copy(root);
  g_object_unref(parser);
  return copy;
}

}  // namespace pictavo::json
