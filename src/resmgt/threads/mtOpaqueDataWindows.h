#pragma once

namespace Orv {

/// One pointer per thread, over an index of thread-local storage. Its values are not owned.
class MtOpaqueDataWindows {
public:
    MtOpaqueDataWindows();
    ~MtOpaqueDataWindows();

    MtOpaqueDataWindows(const MtOpaqueDataWindows&) = delete;
    MtOpaqueDataWindows& operator=(const MtOpaqueDataWindows&) = delete;

    void* getValue() const noexcept;
    void setValue(void* value);

    /// Whether the value is null and the system reports no error.
    bool isNull() const noexcept;

private:
    unsigned long _index;
};

}  // namespace Orv
