#pragma once
// Reference-holding wrapper over a json-glib array, with the lookups of
// JSONObject by index. Parsing throws std::exception on a parse error.

#include <string>
#include <vector>

typedef struct _JsonArray JsonArray;

class JSONObject;

class JSONArray {
 public:
  JSONArray();
  explicit JSONArray(const std::string& text);
  explicit JSONArray(const std::vector<std::string>& strings);
  explicit JSONArray(JsonArray* array);
  JSONArray(const JSONArray& other);
  JSONArray& operator=(const JSONArray& other);
  virtual ~JSONArray();

  int getLength() const;
  JSONArray* getArray(int i) const;
  JSONObject* getObject(int i) const;
  bool getBoolean(int i) const;
  int getInt(int i) const;
  double getDouble(int i) const;
  std::string getString(int i) const;
  bool isNull(int i) const;

  void addArray(const JSONArray& array);
  void addStrings(const std::vector<std::string>& strings);
  void appendElements(JsonArray* other);
  std::string toString() const;

  // The wrapped array (no new reference); null for an empty wrapper.
  JsonArray* getJsonArray() const { return mJsonArray; }

 private:
  JsonArray* mJsonArray = nullptr;
};
