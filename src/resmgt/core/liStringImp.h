#pragma once

#include <cstddef>
#include <cstring>
#include <new>
#include <string_view>

#include "arrayPtr.h"
#include "rcBase.h"
#include "rcPvtEngPtr.h"
#include "resmgtApi.h"

namespace Orv {

/// The characters of an LiString, shared by its copies.
///
/// Length and capacity count characters without the terminating NUL; both fit an int. A short text
/// stands in the same piece of memory as the object, in its room; a longer one, and one that was
/// handed over, in a buffer of the C allocator.
///
/// - Threads: changed only by the one string that holds it, see RCPvtEngPtr::isUnshared().
/// - Errors: std::bad_alloc and LiStringEx::ExTooLong; either leaves the text as it was.
class ORV_RESMGT_API LiStringImp final : public RCBase<LkCounter<long>> {
public:
    using Ptr = RCPvtEngPtr<LiStringImp>;

    /// A copy of @p text without slack.
    static Ptr create(std::string_view text);

    /// The two texts in one, with the slack that appending @p right to a copy of @p left gives, and
    /// with room to grow by small pieces.
    static Ptr createJoined(std::string_view left, std::string_view right);

    /// Takes @p chars, NUL-terminated, over.
    /// @throws RCEx::ExNullPtr if there are none.
    static Ptr create(ArrayPtr<char> chars);

    /// The implementation that all empty strings share; it is never destroyed.
    static const Ptr& getEmpty() noexcept;

    ~LiStringImp() noexcept override;
    LiStringImp(const LiStringImp&) = delete;
    LiStringImp& operator=(const LiStringImp&) = delete;

    const char* getChars() const noexcept { return _chars; }
    int getLength() const noexcept { return _length; }
    int getCapacity() const noexcept;
    std::string_view getText() const noexcept {
        return {_chars, static_cast<std::size_t>(_length)};
    }

    /// False if no NUL stands among the characters, so that the first one ends the text.
    bool hasNul() const noexcept { return _hasNul; }

    /// Appends one character if there is room for it and it is no NUL.
    bool tryAppend(char character) noexcept {
        if (_length == _limit || character == '\0') return false;
        const char end[2] = {character, '\0'};
        std::memcpy(_chars + _length++, end, 2);
        return true;
    }

    /// Appends @p text, which may lie in this text.
    void append(std::string_view text);

    /// Overwrites characters, all of which exist, with @p text, which may lie in this text.
    void overwrite(int position, std::string_view text) noexcept;

    /// A buffer with the text; this object keeps none or a copy and must not be used any more.
    ArrayPtrRet<char> releaseChars();

    /// Capacity after @p added characters: grows by the new length, not by doubling.
    /// @throws LiStringEx::ExTooLong
    static int computeCapacity(int capacity, int length, std::size_t added);

    /// @throws LiStringEx::ExOutOfBounds unless @p index is that of a character.
    void checkIndex(long long index) const {
        if (index < 0 || index >= _length) throwOutOfBounds(index);
    }

    static void operator delete(void* memory) noexcept;

private:
    template <class T>
    friend class RCBasePtr;

    struct Room {
        int nbBytes;
    };

    int _length = 0;
    int _capacity = 0;     // not counting what tryAppend() has appended since
    int _limit;            // the length that the present buffer can take, at least the capacity
    bool _hasNul = false;  // may stay set when the NUL is overwritten
    char* _chars;

    // Where the implementation of all empty strings is made.
    alignas(8) static std::byte _emptyMemory[];

    explicit LiStringImp(Room room) noexcept : _limit(room.nbBytes - 1), _chars(getRoom()) {}

    static Ptr create(std::string_view text, int capacity, std::size_t minimalRoom);
    static void* operator new(std::size_t size, Room room);
    static void operator delete(void* memory, Room room) noexcept;

    // Hide those of the base. The empty implementation is not counted: else all threads that make
    // empty strings would fight for its count. An only holder needs no atomic operation to see that
    // it is the last one.
    void incReferenceCount() const noexcept {
        if (!isForEver()) RCBase::incReferenceCount();
    }
    void decReferenceCount() const {
        if (isForEver()) return;
        if (RCBase::getReferenceCount() == 1) {
            RCBase::destroyUnheld();
        } else {
            RCBase::decReferenceCount();
        }
    }
    bool isForEver() const noexcept {
        return static_cast<const void*>(this) == static_cast<const void*>(_emptyMemory);
    }

    char* getRoom() noexcept { return reinterpret_cast<char*>(this + 1); }
    bool isInRoom() const noexcept { return _chars == reinterpret_cast<const char*>(this + 1); }
    void reserve(int capacity);
    [[noreturn]] void throwOutOfBounds(long long index) const;
};

}  // namespace Orv
