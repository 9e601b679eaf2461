#pragma once
// The photos of the collage in cell order, with the pan state of the item
// being dragged by a finger and two slots the main view uses while a photo
// is dragged onto another cell.

#include <cstdint>

class Bitmap;
class CLyMultiGridSrcItem;
struct _CLyMultiGridSrcItemListImpl;

class CLyMultiGridSrcItemList {
 public:
  CLyMultiGridSrcItemList();
  virtual ~CLyMultiGridSrcItemList();
  CLyMultiGridSrcItemList(const CLyMultiGridSrcItemList&) = delete;
  CLyMultiGridSrcItemList& operator=(const CLyMultiGridSrcItemList&) = delete;

  // Takes ownership of the item.
  void add(CLyMultiGridSrcItem* item);
  // Null when the index is out of range.
  CLyMultiGridSrcItem* get(int index) const;
  int count() const;
  // Removes the entry, destroying the item when asked; false for a bad index.
  bool remove(int index, bool deleteItem);
  void clear(bool deleteItems);
  // Exchanges two items and resets both crops; false unless both indexes
  // are valid and different.
  bool swap(int i, int j);

  // Starts panning item `index`.
  void select(int index);
  int getSelected() const;
  bool isMoving() const;
  // Pans the selected item by the movement since the last point, when it
  // exceeds the move threshold; true when its crop moved.
  bool move(int index, int x, int y);
  void setLastPoint(int x, int y);
  void getLastPoint(int& x, int& y) const;
  void resetMove();
  bool pinchZoom(int index, float distance);
  // Gives the selected item a new bitmap (the old one is destroyed); false without a selection.
  bool setBitmapOfSelected(Bitmap* bitmap);
  // The item with the most pixels (the first of equals); -1 when empty.
  int indexOfLargest() const;

  // The main view's two slots (-1 when unset): the cell a photo is dragged
  // from and the cell it is dropped on.
  int getDragSource() const;
  void setDragSource(int index);
  int getDragTarget() const;
  void setDragTarget(int index);
  void resetDrag();

  static constexpr int kMoveThreshold = 4;

 private:
  _CLyMultiGridSrcItemListImpl* _pv;
};
