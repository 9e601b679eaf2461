#pragma once
// Internal to the image filter: memory for working images. Looks run on the
// same photo again and again (the editor previews each one in turn), so
// released blocks are kept in a small per-thread cache; reusing warm memory
// spares the page faults that fresh allocations of megabytes cost.

#include <cstddef>
#include <cstdint>
#include <memory>

namespace imgfilter {

class ScratchBlock {
 public:
  ScratchBlock() = default;
  ScratchBlock(ScratchBlock&& other) noexcept;
  ScratchBlock& operator=(ScratchBlock&& other) noexcept;
  ScratchBlock(const ScratchBlock&) = delete;
  ScratchBlock& operator=(const ScratchBlock&) = delete;
  ~ScratchBlock();

  // n bytes, all zero.
  void assignZero(size_t n);
  uint8_t* data() { return mData.get(); }
  const uint8_t* data() const { return mData.get(); }
  size_t size() const { return mSize; }
  void swap(ScratchBlock& other) noexcept;

  // Bytes the calling thread keeps cached for reuse.
  static size_t cachedBytes();

 private:
  void release();

  std::unique_ptr<uint8_t[]> mData;
  size_t mSize = 0;
  size_t mCapacity = 0;
};

inline void swap(ScratchBlock& a, ScratchBlock& b) noexcept {
  a.swap(b);
}

}  // namespace imgfilter
