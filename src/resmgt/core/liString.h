#pragma once

#include <compare>
#include <cstdint>
#include <cstring>
#include <functional>
#include <iosfwd>
#include <string_view>

#include "liStringImp.h"

namespace Orv {

/// Text of 8-bit characters, a value whose copies share their characters until one is changed.
///
/// A copy costs one atomic increment. Characters are plain bytes, compared as unsigned ones; a NUL
/// ends the text for find, hash, order and output, while length and equality of two strings count
/// what follows it. Positions and lengths are in characters. A moved-from string is empty.
///
/// - Threads: copies may be used by different threads at once, one object by one thread at a time.
/// - Errors: LiStringEx::ExOutOfBounds for a position, LiStringEx::ExTooLong (std::length_error)
///   for more than 2147483647 characters, std::bad_alloc; each leaves the string as it was.
/// - Arguments may be the string itself or lie in it.
class ORV_RESMGT_API LiString {
public:
    LiString() noexcept : _imp(LiStringImp::getEmpty()) {}
    LiString(const char* text);  ///< Null is empty.
    explicit LiString(std::string_view text);
    explicit LiString(ArrayPtr<char> chars);  ///< Takes the buffer over, without a copy.
    explicit LiString(std::ostringstream& stream);

    /// @p count characters of @p other from @p start on; empty for 0 characters from anywhere.
    LiString(const LiString& other, int start, int count);

    LiString(const LiString&) noexcept = default;
    LiString(LiString&& other) noexcept : _imp(std::move(other._imp)) { other.makeEmpty(); }
    ~LiString() = default;

    LiString& operator=(const LiString&) = default;
    LiString& operator=(LiString&& other) noexcept;
    LiString& operator=(const char* text) { return *this = LiString(text); }

    LiString& operator+=(const LiString& text) { return append(text._imp->getText()); }
    LiString& operator+=(const char* text);  ///< Null appends nothing.
    LiString& operator+=(char character) {
        LiStringImp* const imp = _imp.get();
        if (imp != nullptr && _imp.isUnshared() && imp->tryAppend(character)) return *this;
        return appendSlowly(character);
    }

    /// Overwrites characters in place; the length stays. Only the last position is checked: what
    /// lies before the string is left out.
    void replace(int position, const LiString& text);
    void replace(int position, char character);

    /// The characters in a buffer that the caller frees; the string is empty then.
    ArrayPtrRet<char> releaseChars();

    /// NUL-terminated; valid until the string changes.
    const char* getChars() const { return _imp->getChars(); }
    std::string_view getText() const { return _imp->getText(); }  ///< As getChars().
    int getLength() const { return _imp->getLength(); }
    bool isEmpty() const { return _imp->getLength() == 0; }
    char operator[](int position) const {
        _imp->checkIndex(position);
        return _imp->getChars()[position];
    }

    /// Position of the first occurrence, -1 if there is none. An empty text is found at 0.
    int find(const LiString& text) const { return find(text.getChars()); }
    int find(const char* text) const;
    bool has(const LiString& text) const { return find(text) != -1; }
    bool has(const char* text) const { return find(text) != -1; }
    bool hasPrefix(const LiString& prefix) const;

    /// h = h * 5 + c over the characters, as signed bytes, modulo 2^32.
    std::uint64_t hash() const;
    explicit operator std::uint64_t() const { return hash(); }

    friend bool operator==(const LiString& left, const LiString& right) {
        return left._imp->getText() == right._imp->getText();
    }
    friend bool operator==(const LiString& left, const char* right) {
        return compare(left.getChars(), right) == 0;
    }
    friend std::weak_ordering operator<=>(const LiString& left, const LiString& right) {
        // Without NULs inside, the order of two C strings is that of their characters.
        if (!left._imp->hasNul() && !right._imp->hasNul())
            return left.getText() <=> right.getText();
        return compare(left.getChars(), right.getChars()) <=> 0;
    }
    friend std::weak_ordering operator<=>(const LiString& left, const char* right) {
        return compare(left.getChars(), right) <=> 0;
    }

    friend LiString operator+(const LiString& left, const LiString& right) {
        return LiString(LiStringImp::createJoined(left.getText(), right.getText()));
    }
    friend LiString operator+(const LiString& left, const char* right) {
        return LiString(LiStringImp::createJoined(left.getText(), viewOf(right)));
    }
    friend LiString operator+(const char* left, const LiString& right) {
        return LiString(LiStringImp::createJoined(viewOf(left), right.getText()));
    }
    friend LiString operator+(const LiString& left, char right) {
        return LiString(LiStringImp::createJoined(left.getText(), {&right, 1}));
    }
    friend LiString operator+(char left, const LiString& right) {
        return LiString(LiStringImp::createJoined({&left, 1}, right.getText()));
    }
    friend LiString operator+(LiString&& left, const LiString& right) {
        return std::move(left += right);
    }
    friend LiString operator+(LiString&& left, const char* right) {
        return std::move(left += right);
    }
    friend LiString operator+(LiString&& left, char right) { return std::move(left += right); }

    /// Writes up to the first NUL, as a C string.
    friend ORV_RESMGT_API std::ostream& operator<<(std::ostream& stream, const LiString& text);

    /// Reads a word of any length; on failure the string keeps its value.
    friend ORV_RESMGT_API std::istream& operator>>(std::istream& stream, LiString& text);

private:
    LiStringImp::Ptr _imp;  // null only where an object was destroyed or never constructed

    explicit LiString(LiStringImp::Ptr imp) noexcept : _imp(std::move(imp)) {}

    static std::string_view viewOf(const char* text) noexcept {
        return text != nullptr ? std::string_view(text) : std::string_view();
    }

    /// -1, 0 or 1, by unsigned bytes; null is empty.
    static int compare(const char* left, const char* right) noexcept {
        const int order = std::strcmp(left != nullptr ? left : "", right != nullptr ? right : "");
        return (order > 0) - (order < 0);
    }

    void makeEmpty() noexcept { _imp = LiStringImp::getEmpty(); }
    LiString& append(std::string_view text);
    LiString& appendSlowly(char character);
    void unshare();
};

}  // namespace Orv

template <>
struct std::hash<Orv::LiString> {
    std::size_t operator()(const Orv::LiString& text) const { return text.hash(); }
};
