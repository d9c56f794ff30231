#pragma once

#include <cstddef>
#include <memory>

#include "mbUnloadStrategy.h"

namespace Orv {

/// Lets the buffer give way that was not used for the longest time: where what was used lately will
/// be used again. Where everything is used in turn, round and round, take MbUnloadRandom.
///
/// - Cost: every operation takes constant time; about 50 bytes per buffer, from the heap, only while
///   the number of buffers grows.
class ORV_RESMGT_API MbUnloadLRU : public MbUnloadStrategy {
public:
    /// @param nbBuffers  room is made for so many; more may come.
    explicit MbUnloadLRU(int nbBuffers);
    ~MbUnloadLRU() override;

    const char* getName() const override;
    void insertBuffer(MbBufferImp* buffer) override;
    void removeBuffer(MbBufferImp* buffer) override;
    MbBufferImp* selectVictim() const override;
    bool isEmpty() const override;
    void dump(std::ostream&) const override;

private:
    class Books;
    std::unique_ptr<Books> _books;  // never null
};

}  // namespace Orv
