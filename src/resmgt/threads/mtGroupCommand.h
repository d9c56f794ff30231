#pragma once

namespace Orv {

class MtThread;

/// A plain function and its argument, for MtThreadGroup::execute(). A value.
class MtGroupCommand {
public:
    using Function = void (*)(MtThread& thread, void* argument);

    /// @param argument  borrowed; may be null.
    explicit MtGroupCommand(Function function, void* argument = nullptr) noexcept
        : _function(function), _argument(argument) {}

    void execute(MtThread& thread) const { _function(thread, _argument); }

private:
    Function _function;
    void* _argument;
};

}  // namespace Orv
