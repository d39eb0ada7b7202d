#ifndef QX_STATS_LEVELS_H
#define QX_STATS_LEVELS_H

#include "frame/scratch.h"

#include <cstddef>
#include <cstring>

namespace qx {

struct Level {
    DBL sum;
    I32 label;
    I32 count;
};

// The levels of a factor in the order of their first appearance, with a hash table of their
// indices: open addressing, at most half full.
class Levels {
public:
    ErrorCode reserve(int32_t limit) {
        limit_ = limit;
        int64_t slots = 4;
        for (; slots < 2 * int64_t{limit}; slots *= 2)
            ;
        mask_ = static_cast<uint32_t>(slots - 1);
        if (const ErrorCode failed = levels_.allocate(limit * int64_t{sizeof(Level)}))
            return failed;
        if (const ErrorCode failed = places_.allocate(slots))
            return failed;
        std::memset(places_.data(), 0, static_cast<std::size_t>(slots) * sizeof(I32));
        return 0;
    }

    // The level of a label, created if it is new; null beyond the limit.
    Level *find(int32_t label) {
        const int32_t place = placeOf(label);
        return place < 0 ? nullptr : &at(place);
    }
    // The same, as an index; -1 beyond the limit.
    int32_t placeOf(int32_t label) {
        for (uint32_t slot = Hash(label) & mask_;; slot = (slot + 1) & mask_) {
            I32 &place = places_[static_cast<std::ptrdiff_t>(slot)]; // counts from 1; 0 means free
            if (place == 0) {
                if (count_ == limit_)
                    return -1;
                place = ++count_;
                at(count_ - 1) = {0.0, label, 0};
                return count_ - 1;
            }
            if (at(place - 1).label == label)
                return place - 1;
        }
    }

    int32_t count() const { return count_; }
    Level &at(std::ptrdiff_t i) const { return static_cast<Level *>(levels_.bytes())[i]; }
    ErrorCode release() { return Merge(levels_.release(), places_.release()); }

private:
    // The finaliser of MurmurHash3 (A. Appleby): every bit of the label affects every bit of the
    // hash.
    static uint32_t Hash(int32_t label) {
        uint32_t h = static_cast<uint32_t>(label);
        h = (h ^ (h >> 16)) * 0x85ebca6bu;
        h = (h ^ (h >> 13)) * 0xc2b2ae35u;
        return h ^ (h >> 16);
    }

    ScratchBytes levels_;
    Scratch<ElementType::I32> places_;
    int32_t limit_ = 0;
    int32_t count_ = 0;
    uint32_t mask_ = 0;
};

} // namespace qx

#endif
