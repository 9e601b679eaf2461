#pragma once
// Reference-holding wrapper over a json-glib object. The parsing constructors
// throw std::exception on a parse error (the only throwing code of the
// program); a root of the wrong type leaves an empty wrapper whose lookups
// answer null, 0, false or "". Wrappers returned by the getters are owned by
// the caller.

#include <string>
#include <vector>

typedef struct _JsonObject JsonObject;

class JSONArray;

class JSONObject {
 public:
  JSONObject();
  explicit JSONObject(const std::string& text);
  JSONObject(const std::string& path, bool fromFile);
  explicit JSONObject(JsonObject* object);
  JSONObject(const JSONObject& other);
  JSONObject& operator=(const JSONObject& other);
  virtual ~JSONObject();

  bool hasMember(const std::string& name) const;
  JSONArray* getArray(const std::string& name) const;
  JSONObject* getObject(const std::string& name) const;
  bool getBoolean(const std::string& name) const;
  int getInt(const std::string& name) const;
  double getDouble(const std::string& name) const;
  std::string getString(const std::string& name) const;
  bool isNull(const std::string& name) const;
  void setArray(const std::string& name, const JSONArray& array);
  std::string toString() const;
  std::vector<std::string> getMemberNames() const;

  // The wrapped object (no new reference); null for an empty wrapper.
  JsonObject* getJsonObject() const { return mJson; }

 private:
  void _adoptParsedRoot(void* rootNode);
  JsonObject* mJson = nullptr;
};
