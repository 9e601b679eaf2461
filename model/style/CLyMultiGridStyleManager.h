#pragma once
// The catalogue of collage layouts: for every image count 2..6 the ordered
// grid layouts of "styles/grid/styleimage<N>.json", their thumbnails and
// their cell rectangles. One instance for the process, used on the main loop.

#include <string>

class CLyGridImageLayoutInfo;
struct _CLyMultiGridStyleManagerImpl;

class CLyMultiGridStyleManager {
 public:
  static constexpr int kMinImageCount = 2;
  static constexpr int kMaxImageCount = 6;

  static CLyMultiGridStyleManager& getInstance();

  // Reads the style files from the application's resource directory; true
  // when every file was read. A file that cannot be parsed is logged and
  // ends the loading (later counts stay empty) instead of aborting start-up.
  bool initialize();
  // The same from another resource directory (ending in '/'); for tools and tests.
  bool initialize(const std::string& resourceDir);
  // Drops every loaded layout.
  void clear();

  CLyGridImageLayoutInfo* getGridImageLayout(int imgCnt, int nIndex) const;
  int getGridLayoutCount(int imgCnt) const;
  int getLayoutCount(int imgCnt) const;
  // Bare icon file name of a layout's thumbnail; empty when there is none.
  std::string getLayoutThumbnailPath(int imgCnt, int nIndex, bool pressed) const;
  // Fills out[k] with cell k's left, top, right, bottom; false only for a bad count.
  bool getDrawRects(int imgCnt, int proportion, int layoutIndex, float (*out)[4]) const;
  int getRandomStyleRange() const { return 28; }

  // Number of thumbnails the icon table holds for a count (0 outside 2..6).
  static int getThumbnailCount(int imgCnt);

 private:
  CLyMultiGridStyleManager();
  ~CLyMultiGridStyleManager();
  CLyMultiGridStyleManager(const CLyMultiGridStyleManager&) = delete;
  CLyMultiGridStyleManager& operator=(const CLyMultiGridStyleManager&) = delete;

  bool _loadGridStyleFiles(const std::string& resourceDir);
  bool _addGridImageLayout(int imgCnt, CLyGridImageLayoutInfo* pLayoutInfo);

  _CLyMultiGridStyleManagerImpl* mImpl;
};
