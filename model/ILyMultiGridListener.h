#pragma once
// Receives the decoded photos of the decoder threads. Called on the worker
// thread: the implementation does its own locking and must not touch
// user-interface objects there.

class Bitmap;

class ILyMultiGridListener {
 public:
  virtual ~ILyMultiGridListener() = default;
  // The bitmap of source item `index`, or null when the file could not be
  // decoded. The listener owns the bitmap from here on.
  virtual void onInvalidateMultiGrid(int index, Bitmap* bitmap) = 0;
};
