#include "platform/image-filter/filter_scratch.h"

#include <cstring>
#include <utility>
#include <vector>

namespace imgfilter {

namespace {

// A few blocks per thread, none larger than a 2000 x 2000 four-channel
// image, and 48 MB at most in all: about one look's working set on an
// editing-size photo, never more.
constexpr size_t kMaxBlocks = 6;
constexpr size_t kMaxBlockBytes = 16u << 20;
constexpr size_t kMaxCachedBytes = 48u << 20;

struct Block {
  std::unique_ptr<uint8_t[]> data;
  size_t capacity;
};

std::vector<Block>& cache() {
  thread_local std::vector<Block> blocks;
  return blocks;
}

}  // namespace

ScratchBlock::ScratchBlock(ScratchBlock&& other) noexcept {
  swap(other);
}

ScratchBlock& ScratchBlock::operator=(ScratchBlock&& other) noexcept {
  if (this != &other) {
    release();
    swap(other);
  }
  return *this;
}

ScratchBlock::~ScratchBlock() {
  release();
}

void ScratchBlock::swap(ScratchBlock& other) noexcept {
  std::swap(mData, other.mData);
  std::swap(mSize, other.mSize);
  std::swap(mCapacity, other.mCapacity);
}

size_t ScratchBlock::cachedBytes() {
  size_t total = 0;
  for (const Block& b : cache()) total += b.capacity;
  return total;
}

void ScratchBlock::assignZero(size_t n) {
  if (n > mCapacity) {
    release();
    // The smallest cached block that fits, else a new one.
    auto& blocks = cache();
    size_t best = blocks.size();
    for (size_t i = 0; i < blocks.size(); ++i)
      if (blocks[i].capacity >= n && (best == blocks.size() || blocks[i].capacity < blocks[best].capacity))
        best = i;
    if (best < blocks.size()) {
      mData = std::move(blocks[best].data);
      mCapacity = blocks[best].capacity;
      blocks.erase(blocks.begin() + (std::ptrdiff_t)best);
    } else {
      mData.reset(new uint8_t[n]);
      mCapacity = n;
    }
  }
  mSize = n;
  if (n) std::memset(mData.get(), 0, n);
}

void ScratchBlock::release() {
  if (!mData) return;
  auto& blocks = cache();
  if (mCapacity <= kMaxBlockBytes) {
    // Make room by dropping smaller blocks: the larger ones are those whose
    // page faults cost most.
    auto cached = [] { return cachedBytes(); };
    while (!blocks.empty() && (blocks.size() == kMaxBlocks || cached() + mCapacity > kMaxCachedBytes)) {
      size_t smallest = 0;
      for (size_t i = 1; i < blocks.size(); ++i)
        if (blocks[i].capacity < blocks[smallest].capacity) smallest = i;
      if (blocks[smallest].capacity >= mCapacity) break;
      blocks.erase(blocks.begin() + (std::ptrdiff_t)smallest);
    }
    if (blocks.size() < kMaxBlocks && cached() + mCapacity <= kMaxCachedBytes)
      blocks.push_back({std::move(mData), mCapacity});
  }
  mData.reset();
  mSize = 0;
  mCapacity = 0;
}

}  // namespace imgfilter
