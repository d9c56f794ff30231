#pragma once

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <emmintrin.h>

namespace Orv {

/// Looks through the entries of a tree's node: all of them and without a branch, since where a
/// search ends is random and a branch guessed wrong costs more than the rest of the node.
///
/// For words of 32 bits four entries at a time (SSE2, which every 64-bit x86 has).
template <class Word, unsigned SIZE>
class DaNodeScan {
public:
    using Entries = std::array<Word, SIZE>;

    /// @param entries  in ascending order.
    static unsigned countBelow(const Entries& entries, Word limit) noexcept {
        unsigned count = 0;
        for (const Word entry : entries) count += entry < limit;
        return count;
    }

    /// The first entry that is @p wanted or more; SIZE if there is none.
    static unsigned firstAtLeast(const Entries& entries, Word wanted) noexcept {
        unsigned first = SIZE;
        for (unsigned i = SIZE; i-- > 0;) first = entries[i] >= wanted ? i : first;
        return first;
    }

    /// The largest entry but for one, or for none with @p except = SIZE.
    static Word largest(const Entries& entries, unsigned except) noexcept {
        Word result = 0;
        for (unsigned i = 0; i < SIZE; ++i) {
            result = std::max(result, i == except ? Word(0) : entries[i]);
        }
        return result;
    }

    /// What is left of each length when its address, counted from @p origin, is rounded up.
    static Entries fits(const Entries& addresses, const Entries& lengths, Word origin,
                        Word mask) noexcept {
        Entries result;
        for (unsigned i = 0; i < SIZE; ++i) {
            const Word padding = (Word(0) - (origin + addresses[i])) & mask;
            result[i] = lengths[i] > padding ? lengths[i] - padding : 0;
        }
        return result;
    }
};

template <unsigned SIZE>
class DaNodeScan<std::uint32_t, SIZE> {
    static_assert(SIZE % 16 == 0 && SIZE <= 32);
    using Vector = __m128i;

public:
    using Entries = std::array<std::uint32_t, SIZE>;

    static unsigned countBelow(const Entries& entries, std::uint32_t limit) noexcept {
        return firstAtLeast(entries, limit);
    }

    static unsigned firstAtLeast(const Entries& entries, std::uint32_t wanted) noexcept {
        return static_cast<unsigned>(std::countr_one(bitsBelow(entries, wanted)));
    }

    static std::uint32_t largest(const Entries& entries, unsigned except) noexcept {
        const Vector excepts = all(except);
        Vector slots = _mm_set_epi32(3, 2, 1, 0);
        Vector result = all(1u << 31);  // 0, flipped
        for (unsigned i = 0; i < SIZE; i += 4) {
            const Vector isExcept = _mm_cmpeq_epi32(slots, excepts);
            result = larger(result, flipped(_mm_andnot_si128(isExcept, load(entries, i))));
            slots = _mm_add_epi32(slots, all(4));
        }
        result = larger(result, _mm_shuffle_epi32(result, _MM_SHUFFLE(1, 0, 3, 2)));
        result = larger(result, _mm_shuffle_epi32(result, _MM_SHUFFLE(2, 3, 0, 1)));
        return static_cast<std::uint32_t>(_mm_cvtsi128_si32(flipped(result)));
    }

    static Entries fits(const Entries& addresses, const Entries& lengths, std::uint32_t origin,
                        std::uint32_t mask) noexcept {
        Entries result;
        const Vector origins = all(origin);
        const Vector masks = all(mask);
        for (unsigned i = 0; i < SIZE; i += 4) {
            const Vector starts = _mm_add_epi32(origins, load(addresses, i));
            const Vector paddings =
                _mm_and_si128(_mm_sub_epi32(_mm_setzero_si128(), starts), masks);
            const Vector length = load(lengths, i);
            const Vector isLonger = _mm_cmpgt_epi32(flipped(length), flipped(paddings));
            const Vector fit = _mm_and_si128(_mm_sub_epi32(length, paddings), isLonger);
            _mm_storeu_si128(reinterpret_cast<Vector*>(result.data() + i), fit);
        }
        return result;
    }

private:
    static Vector load(const Entries& entries, unsigned i) noexcept {
        return _mm_loadu_si128(reinterpret_cast<const Vector*>(entries.data() + i));
    }
    static Vector all(std::uint32_t value) noexcept {
        return _mm_set1_epi32(static_cast<int>(value));
    }
    /// SSE2 compares signed numbers only: with the highest bit flipped unsigned ones compare alike.
    static Vector flipped(Vector vector) noexcept { return _mm_xor_si128(vector, all(1u << 31)); }

    static Vector larger(Vector a, Vector b) noexcept {
        const Vector isLarger = _mm_cmpgt_epi32(a, b);
        return _mm_or_si128(_mm_and_si128(isLarger, a), _mm_andnot_si128(isLarger, b));
    }

    /// A bit for each entry, set if it is less than the limit.
    static std::uint32_t bitsBelow(const Entries& entries, std::uint32_t limit) noexcept {
        const Vector limits = flipped(all(limit));
        const auto below = [&](unsigned i) {
            return _mm_cmplt_epi32(flipped(load(entries, i)), limits);
        };
        std::uint32_t bits = 0;
        for (unsigned i = 0; i < SIZE; i += 16) {
            const Vector front = _mm_packs_epi32(below(i), below(i + 4));
            const Vector back = _mm_packs_epi32(below(i + 8), below(i + 12));
            const int found = _mm_movemask_epi8(_mm_packs_epi16(front, back));
            bits |= static_cast<std::uint32_t>(found) << i;
        }
        return bits;
    }
};

}  // namespace Orv
