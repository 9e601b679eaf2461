#pragma once
// Root of the size modifiers: the rules that decide how dividers move when a
// handler drag would make a cell smaller than the minimum.

#include <cstdint>
#include <vector>

class CLySizeModifierBase {
 public:
  CLySizeModifierBase() = default;
  virtual ~CLySizeModifierBase() = default;
  CLySizeModifierBase(const CLySizeModifierBase&) = delete;
  CLySizeModifierBase& operator=(const CLySizeModifierBase&) = delete;

  // var: the drag along the axis as a fraction of the collage; limit: the
  // minimum cell size; count/marks: the cells the candidate layout would make
  // too small on that axis. True when the rule has handled the axis (and
  // already rewritten the live cells): the caller must not apply the
  // candidate values of that axis.
  virtual bool modifyX(float var, float limit, int32_t count, const std::vector<int32_t>& marks) = 0;
  virtual bool modifyY(float var, float limit, int32_t count, const std::vector<int32_t>& marks) = 0;
};
