#include <mutex>
#include <new>
#include <utility>

#include "devRequestPoolPrivate.h"
#include "mtSpecificData.h"

namespace Orv {

namespace {

#if defined(__SANITIZE_ADDRESS__)
constexpr bool isPooling = false;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
constexpr bool isPooling = false;
#else
constexpr bool isPooling = true;
#endif
#else
constexpr bool isPooling = true;
#endif

constexpr std::size_t GRANULE = 64;
constexpr std::size_t NB_SIZES = 8;  // up to 512 bytes; larger requests are rare
constexpr std::size_t BATCH = 16;

struct Block {
    Block* next;
    Block* nextBatch;
};

/// Free blocks of one size that no thread keeps: batches of at most BATCH blocks.
struct Depot {
    std::mutex mutex;
    Block* batches = nullptr;

    void put(Block* batch) noexcept {
        const std::lock_guard guard(mutex);
        batch->nextBatch = std::exchange(batches, batch);
    }
    Block* take() noexcept {
        const std::lock_guard guard(mutex);
        return batches == nullptr ? nullptr : std::exchange(batches, batches->nextBatch);
    }
};

// Threads end after static objects are gone, too.
Depot* getDepots() noexcept {
    static Depot* const depots = new Depot[NB_SIZES];
    return depots;
}

/// What one thread keeps: of each size up to two batches.
class Cache {
public:
    struct Size {
        Block* first = nullptr;
        std::size_t count = 0;   // in the list at first
        Block* upper = nullptr;  // a full batch
    };
    Size sizes[NB_SIZES];

    ~Cache();

    /// Null if nobody would give back what the thread keeps.
    static Cache* ofThread() noexcept;
};

constinit thread_local Cache* current = nullptr;

Cache::~Cache() {
    current = nullptr;
    for (std::size_t i = 0; i < NB_SIZES; ++i) {
        if (sizes[i].first != nullptr) getDepots()[i].put(sizes[i].first);
        if (sizes[i].upper != nullptr) getDepots()[i].put(sizes[i].upper);
    }
}

Cache* Cache::ofThread() noexcept {
    if (current != nullptr) [[likely]]
        return current;
    try {
        static const MtSpecificData<Cache>& caches = *new MtSpecificData<Cache>("DevRequestPool");
        current = &caches.get();
    } catch (...) {
        // No memory: the block goes to or comes from the heap.
    }
    return current;
}

constexpr std::size_t indexOf(std::size_t nbBytes) noexcept {
    return (nbBytes + GRANULE - 1) / GRANULE - 1;
}

}  // namespace

void* DevRequestPool::allocate(std::size_t nbBytes) {
    const std::size_t index = indexOf(nbBytes);
    if (!isPooling || index >= NB_SIZES) return ::operator new(nbBytes);
    Cache* const cache = Cache::ofThread();
    if (cache == nullptr) return ::operator new((index + 1) * GRANULE);
    Cache::Size& size = cache->sizes[index];
    if (size.first == nullptr) [[unlikely]] {
        size.first = std::exchange(size.upper, nullptr);
        if (size.first == nullptr) size.first = getDepots()[index].take();
        if (size.first == nullptr) return ::operator new((index + 1) * GRANULE);
        size.count = BATCH;  // or less: then the next batch to be put down is smaller
    }
    if (size.count > 0) --size.count;
    return std::exchange(size.first, size.first->next);
}

void DevRequestPool::release(void* memory, std::size_t nbBytes) noexcept {
    const std::size_t index = indexOf(nbBytes);
    Cache* const cache = isPooling && index < NB_SIZES ? Cache::ofThread() : nullptr;
    if (cache == nullptr) {
        ::operator delete(memory);
        return;
    }
    Cache::Size& size = cache->sizes[index];
    if (size.count >= BATCH) {
        if (size.upper != nullptr) getDepots()[index].put(size.upper);
        size.upper = std::exchange(size.first, nullptr);
        size.count = 0;
    }
    size.first = new (memory) Block{size.first, nullptr};
    ++size.count;
}

}  // namespace Orv
