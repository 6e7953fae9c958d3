// Memory right beside pages that nobody may touch: reading or writing one byte too far ends the
// program.
#ifndef TESTS_GUARD_H
#define TESTS_GUARD_H

#include <utility>
#include <vector>

#include "tests/pages.h"

namespace rig {

// Which end of the bytes touches the inaccessible page.
enum class flush { at_end, at_start };

// `size` bytes, zeroed once and then reused. The first or the last of them lies beside the
// inaccessible page, or `gap` bytes away from it, which also sets the alignment:
//
//   at_end     [ page ... | room     <size bytes><gap> | no access ]
//   at_start   [ no access | <gap><size bytes>    room | ... page ]
//
// room() tells what is accessible around the bytes, for checks that nothing was written there.
class guarded {
  public:
    guarded(size_t size, flush where = flush::at_end, size_t gap = 0)
        : memory_(take(size + gap)), size_(size) {
        data_ = where == flush::at_end ? memory_.begin + memory_.size - gap - size
                                       : memory_.begin + gap;
    }
    ~guarded() {
        if (memory_.begin) spare().push_back(memory_);
    }
    guarded(guarded &&other) noexcept
        : memory_(std::exchange(other.memory_, {})), data_(other.data_), size_(other.size_) {}
    guarded &operator=(guarded &&) = delete;

    uint8_t *data() const { return data_; }
    uint8_t *end() const { return data_ + size_; }
    size_t size() const { return size_; }

    // The accessible bytes around, at most `reach` on either side.
    std::pair<uint8_t *, uint8_t *> room(size_t reach) const {
        const size_t before = size_t(data_ - memory_.begin);
        const size_t behind = size_t(memory_.begin + memory_.size - end());
        return {data_ - (before < reach ? before : reach),
                end() + (behind < reach ? behind : reach)};
    }

  private:
    // The accessible pages between two inaccessible ones.
    struct region {
        uint8_t *begin = nullptr;
        size_t size = 0;
    };

    static std::vector<region> &spare() {
        thread_local std::vector<region> regions;
        return regions;
    }

    // Regions are kept: mapping two for every call would take most of a test's time.
    static region take(size_t size) {
        size_t needed = 4 * page_size();
        while (needed < size) needed *= 2;
        auto &regions = spare();
        for (size_t i = 0; i < regions.size(); i++) {
            if (regions[i].size != needed) continue;
            const region found = regions[i];
            regions[i] = regions.back();
            regions.pop_back();
            return found;
        }
        return {pages_between_inaccessible_ones(needed), needed};
    }

    region memory_;
    uint8_t *data_;
    size_t size_;
};

}  // namespace rig

#endif
