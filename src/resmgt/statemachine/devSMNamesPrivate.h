#pragma once

#include <string_view>
#include <unordered_map>
#include <vector>

#include "liString.h"

namespace Orv {

/// Names in the order in which they were declared, each once.
class DevSMNames {
public:
    static constexpr int NONE = -1;

    /// @return the index of the new name.
    /// @throws DevMgrEx::NameNotUnique
    int add(const LiString& name);

    int find(const LiString& name) const;  ///< NONE if there is no such name.

    int getSize() const noexcept { return static_cast<int>(_names.size()); }
    const std::vector<LiString>& getNames() const noexcept { return _names; }
    const LiString& operator[](int index) const { return _names[static_cast<std::size_t>(index)]; }

private:
    // The hash of LiString is that of its format; for numbered names it gives few values.
    struct Hash {
        std::size_t operator()(const LiString& name) const noexcept {
            return std::hash<std::string_view>()(name.getText());
        }
    };

    std::vector<LiString> _names;
    std::unordered_map<LiString, int, Hash> _indices;
};

}  // namespace Orv
