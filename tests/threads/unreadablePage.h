#pragma once

namespace Orv {

/// A page that nobody may read, right behind one that all may.
class UnreadablePage {
public:
    UnreadablePage();
    ~UnreadablePage();

    UnreadablePage(const UnreadablePage&) = delete;
    UnreadablePage& operator=(const UnreadablePage&) = delete;

    const char* getAddress() const { return _address; }

private:
    static constexpr int PAGE_SIZE = 4096;
    char* _address;
};

}  // namespace Orv
