#pragma once

namespace Orv {

/// Makes `new` fail on the calling thread while it exists: @p nbGranted more succeed.
class NewShortage {
public:
    explicit NewShortage(int nbGranted) noexcept;
    ~NewShortage();

    NewShortage(const NewShortage&) = delete;
    NewShortage& operator=(const NewShortage&) = delete;

    bool hasRefused() const noexcept;

    /// False in programs whose `new` is taken already, by the thread sanitizer.
    static bool isPossible() noexcept;
};

}  // namespace Orv
