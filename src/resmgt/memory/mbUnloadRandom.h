#pragma once

#include <memory>

#include "mbUnloadStrategy.h"

namespace Orv {

/// Lets any buffer give way, each with the same chance: where buffers are used in turn, round and
/// round, so that the one used longest ago is the one needed next.
///
/// - Cost: every operation takes constant time; about 30 bytes per buffer, from the heap, only while
///   the number of buffers grows.
class ORV_RESMGT_API MbUnloadRandom : public MbUnloadStrategy {
public:
    /// @param nbBuffers  room is made for so many; more may come.
    explicit MbUnloadRandom(int nbBuffers);
    ~MbUnloadRandom() override;

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
