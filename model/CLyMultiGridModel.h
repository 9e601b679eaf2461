#pragma once
// The view paddings of config/margins.json: one integer vector per aspect
// ratio item (portrait horizontal, portrait vertical, landscape horizontal,
// landscape vertical).

#include <string>
#include <vector>

struct _CLyMultiGridModelImpl;

class CLyMultiGridModel {
 public:
  // Reads config/margins.json from the application's resource directory.
  CLyMultiGridModel();
  // The same from another resource directory (ending in '/').
  explicit CLyMultiGridModel(const std::string& resourceDir);
  virtual ~CLyMultiGridModel();
  CLyMultiGridModel(const CLyMultiGridModel&) = delete;
  CLyMultiGridModel& operator=(const CLyMultiGridModel&) = delete;

  // The paddings of item `index`; an index beyond the loaded items is logged
  // and answers an empty vector.
  const std::vector<int>& getMargins(int index) const;
  int getMarginsCount() const;

 private:
  void _loadConfigFile(const std::string& resourceDir);
  _CLyMultiGridModelImpl* mImpl;
};
