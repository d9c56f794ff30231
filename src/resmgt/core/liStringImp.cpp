#include "liStringImp.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <limits>

#include "liStringEx.h"
#include "sourceFile.h"

namespace Orv {

namespace {

constexpr int MAX_LENGTH = std::numeric_limits<int>::max();

// Up to this size a text stands beside its object. A longer one is worth a buffer of its own, which
// the allocator can enlarge in place and which can be handed over.
constexpr std::size_t MAX_ROOM = 512;

// Whoever appends once appends again: room for a few dozen characters saves three allocations.
constexpr std::size_t GROWING_ROOM = 72;

int checkLength(std::size_t length) {
    if (length > MAX_LENGTH) throw LiStringEx::ExTooLong(ORV_FILE, __LINE__, length);
    return static_cast<int>(length);
}

// Allocators hand out multiples of 16 bytes less 8 of their own; what would be lost is room.
constexpr std::size_t roundUpAllocation(std::size_t nbBytes) {
    return ((nbBytes + 8 + 15) & ~std::size_t{15}) - 8;
}

bool containsNul(std::string_view text) {
    return !text.empty() && std::memchr(text.data(), '\0', text.size()) != nullptr;
}

void copyText(char* target, std::string_view text) {
    if (!text.empty()) std::memcpy(target, text.data(), text.size());
    target[text.size()] = '\0';
}

constexpr std::size_t EMPTY_ROOM = 8;

}  // namespace

alignas(8) std::byte LiStringImp::_emptyMemory[sizeof(LiStringImp) + EMPTY_ROOM];

void* LiStringImp::operator new(std::size_t size, Room room) {
    void* const memory = std::malloc(size + static_cast<std::size_t>(room.nbBytes));
    if (memory == nullptr) throw std::bad_alloc();
    return memory;
}

void LiStringImp::operator delete(void* memory) noexcept {
    std::free(memory);
}

void LiStringImp::operator delete(void* memory, Room) noexcept {
    std::free(memory);
}

LiStringImp::~LiStringImp() noexcept {
    if (!isInRoom()) std::free(_chars);
}

LiStringImp::Ptr LiStringImp::create(std::string_view text, int capacity, std::size_t minimalRoom) {
    const std::size_t nbBytes = static_cast<std::size_t>(capacity) + 1;
    const bool isInRoom = nbBytes <= MAX_ROOM;
    const std::size_t inRoom = isInRoom ? std::max(nbBytes, minimalRoom) : 0;
    const std::size_t room = roundUpAllocation(sizeof(LiStringImp) + inRoom) - sizeof(LiStringImp);

    Ptr result(new (Room{static_cast<int>(room)}) LiStringImp(Room{static_cast<int>(room)}));
    if (!isInRoom) {
        result->_chars = ArrayPtr<char>::allocate(nbBytes).release();
        result->_limit = capacity;
    }
    copyText(result->_chars, text);
    result->_length = static_cast<int>(text.size());
    result->_capacity = capacity;
    result->_hasNul = containsNul(text);
    return result;
}

LiStringImp::Ptr LiStringImp::create(std::string_view text) {
    return create(text, checkLength(text.size()), 0);
}

LiStringImp::Ptr LiStringImp::createJoined(std::string_view left, std::string_view right) {
    const int leftLength = checkLength(left.size());
    const int capacity = computeCapacity(leftLength, leftLength, right.size());
    Ptr result = create(left, capacity, left.empty() ? GROWING_ROOM : 0);
    result->append(right);
    return result;
}

LiStringImp::Ptr LiStringImp::create(ArrayPtr<char> chars) {
    const int length = checkLength(std::strlen(&chars[0]));
    Ptr result = create({}, 0, 0);
    result->_chars = chars.release();
    result->_length = result->_capacity = result->_limit = length;
    return result;
}

const LiStringImp::Ptr& LiStringImp::getEmpty() noexcept {
    // In static memory and never destroyed: empty strings need no allocation, and work until the
    // process has ended.
    static_assert(alignof(LiStringImp) <= 8);
    alignas(Ptr) static std::byte holder[sizeof(Ptr)];
    static const Ptr& empty = *[] {
        auto* const implementation = ::new (_emptyMemory) LiStringImp(Room{EMPTY_ROOM});
        implementation->_chars[0] = '\0';
        implementation->_limit = 0;
        return ::new (holder) Ptr(implementation);
    }();
    return empty;
}

int LiStringImp::computeCapacity(int capacity, int length, std::size_t added) {
    const std::size_t needed = static_cast<std::size_t>(length) + added;
    if (added > MAX_LENGTH || needed > MAX_LENGTH) {
        throw LiStringEx::ExTooLong(ORV_FILE, __LINE__, needed);
    }
    if (needed <= static_cast<std::size_t>(capacity)) return capacity;
    return static_cast<int>(
        std::min<std::size_t>(static_cast<std::size_t>(capacity) + needed, MAX_LENGTH));
}

int LiStringImp::getCapacity() const noexcept {
    // Single characters double it whenever they reach it.
    long long capacity = _capacity;
    while (capacity < _length) capacity = 2 * capacity + 1;
    return static_cast<int>(std::min<long long>(capacity, MAX_LENGTH));
}

void LiStringImp::append(std::string_view text) {
    const int capacity = computeCapacity(getCapacity(), _length, text.size());
    const int length = _length + static_cast<int>(text.size());
    if (length > _limit) {
        const std::less_equal<const char*> isNotBehind;
        const bool isOwn =
            isNotBehind(_chars, text.data()) && isNotBehind(text.data(), _chars + _length);
        const std::ptrdiff_t offset = isOwn ? text.data() - _chars : 0;
        reserve(capacity);
        if (isOwn) text = std::string_view(_chars + offset, text.size());
    }
    copyText(_chars + _length, text);
    _hasNul = _hasNul || containsNul(text);
    _capacity = capacity;
    _length = length;
}

void LiStringImp::overwrite(int position, std::string_view text) noexcept {
    _hasNul = _hasNul || containsNul(text);
    std::memmove(_chars + position, text.data(), text.size());
}

// Makes the buffer larger; the text stays.
void LiStringImp::reserve(int capacity) {
    const std::size_t nbBytes = static_cast<std::size_t>(capacity) + 1;
    if (isInRoom()) {
        char* const chars = ArrayPtr<char>::allocate(nbBytes).release();
        copyText(chars, getText());
        _chars = chars;
    } else {
        void* const chars = std::realloc(_chars, nbBytes);
        if (chars == nullptr) throw std::bad_alloc();
        _chars = static_cast<char*>(chars);
    }
    _limit = capacity;
}

ArrayPtrRet<char> LiStringImp::releaseChars() {
    if (!isInRoom()) return ArrayPtrRet<char>(std::exchange(_chars, getRoom()));
    ArrayPtr<char> copy = ArrayPtr<char>::allocate(static_cast<std::size_t>(_length) + 1);
    copyText(copy.get(), getText());
    return copy;
}

void LiStringImp::throwOutOfBounds(long long index) const {
    // Sums of a position and a count may exceed what the reason can show.
    const long long shown = std::min<long long>(index, MAX_LENGTH);
    throw LiStringEx::ExOutOfBounds("src/resmgt/liStringImp.inline", 28, static_cast<int>(shown), 0,
                                    _length);
}

}  // namespace Orv
