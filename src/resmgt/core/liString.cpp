#include "liString.h"

#include <istream>
#include <locale>
#include <ostream>
#include <sstream>

#include "liStringEx.h"

namespace Orv {

namespace {

constexpr std::uint32_t powerOf5(int exponent) {
    return exponent == 0 ? 1 : 5 * powerOf5(exponent - 1);
}

constexpr std::uint64_t repeat8(std::uint64_t byte) {
    return byte * 0x0101010101010101U;
}

// The hash of eight characters, the first one in the lowest byte.
constexpr std::uint32_t hash8(std::uint64_t bytes) {
    // Unsigned bytes of 128 more than the signed ones keep the sums from borrowing.
    constexpr std::uint32_t EXCESS = 128 * ((powerOf5(8) - 1) / 4);
    bytes ^= repeat8(0x80);
    // Four pairs of neighbours at once, each in 16 bits: p0 p1 p2 p3, the first one lowest.
    const std::uint64_t pairs =
        (bytes & 0x00FF00FF00FF00FFU) * 5 + ((bytes >> 8) & 0x00FF00FF00FF00FFU);
    // The upper halves of the products are p0 * 5^6 + p2 * 5^2 and p1 * 5^4 + p3.
    constexpr std::uint64_t EVEN = std::uint64_t{powerOf5(6)} << 32 | powerOf5(2);
    constexpr std::uint64_t ODD = std::uint64_t{powerOf5(4)} << 32 | powerOf5(0);
    const std::uint64_t sums =
        (pairs & 0x0000FFFF0000FFFFU) * EVEN + ((pairs >> 16) & 0x0000FFFF0000FFFFU) * ODD;
    return static_cast<std::uint32_t>(sums >> 32) - EXCESS;
}

static_assert(hash8(repeat8(0x00)) == 0 && hash8(std::uint64_t{'a'} << 56) == 'a');

}  // namespace

LiString::LiString(const char* text)
    : _imp(text == nullptr || *text == '\0' ? LiStringImp::getEmpty()
                                            : LiStringImp::create(std::string_view(text))) {}

LiString::LiString(std::string_view text)
    : _imp(text.empty() ? LiStringImp::getEmpty() : LiStringImp::create(text)) {}

LiString::LiString(ArrayPtr<char> chars) : _imp(LiStringImp::create(std::move(chars))) {}

LiString::LiString(std::ostringstream& stream) : _imp(LiStringImp::create(stream.view())) {}

LiString::LiString(const LiString& other, int start, int count) : _imp(LiStringImp::getEmpty()) {
    if (count == 0) return;
    const LiStringImp& source = *other._imp;
    source.checkIndex(start);
    if (count < 0) {
        throw LiStringEx::ExOutOfBounds("src/resmgt/liStringImp", 115, count, 0,
                                        source.getLength());
    }
    source.checkIndex(static_cast<long long>(start) + count - 1);
    _imp = LiStringImp::create(
        source.getText().substr(static_cast<std::size_t>(start), static_cast<std::size_t>(count)));
}

LiString& LiString::operator=(LiString&& other) noexcept {
    if (this == &other) return *this;
    _imp = std::move(other._imp);
    other.makeEmpty();
    return *this;
}

LiString& LiString::operator+=(const char* text) {
    return append(viewOf(text));
}

LiString& LiString::append(std::string_view text) {
    if (_imp.isUnshared()) {
        _imp->append(text);
    } else {
        // The old implementation, in which the text may lie, goes last.
        LiStringImp::Ptr(LiStringImp::createJoined(_imp->getText(), text)).swap(_imp);
    }
    return *this;
}

LiString& LiString::appendSlowly(char character) {
    return append({&character, 1});
}

void LiString::unshare() {
    if (!_imp.isUnshared()) LiStringImp::Ptr(LiStringImp::create(_imp->getText())).swap(_imp);
}

void LiString::replace(int position, const LiString& text) {
    if (text.isEmpty()) return;
    _imp->checkIndex(static_cast<long long>(position) + text.getLength() - 1);
    unshare();
    std::string_view source = text.getText();  // now, as the text may be this string
    if (position < 0) {
        source.remove_prefix(static_cast<std::size_t>(-static_cast<long long>(position)));
        position = 0;
    }
    _imp->overwrite(position, source);
}

void LiString::replace(int position, char character) {
    _imp->checkIndex(position);
    unshare();
    _imp->overwrite(position, {&character, 1});
}

ArrayPtrRet<char> LiString::releaseChars() {
    unshare();
    ArrayPtr<char> chars = _imp->releaseChars();
    makeEmpty();
    return chars;
}

int LiString::find(const char* text) const {
    const char* const chars = getChars();
    const char* const found = std::strstr(chars, text != nullptr ? text : "");
    return found != nullptr ? static_cast<int>(found - chars) : -1;
}

bool LiString::hasPrefix(const LiString& prefix) const {
    const std::string_view start = prefix.getText();
    return start.size() <= getText().size() &&
           std::strncmp(getChars(), start.data(), start.size()) == 0;
}

std::uint64_t LiString::hash() const {
    const std::string_view text = _imp->hasNul() ? std::string_view(getChars()) : getText();
    const char* next = text.data();
    const char* const end = next + text.size();
    std::uint32_t result = 0;
    for (; end - next >= 8; next += 8) {
        std::uint64_t bytes = 0;
        std::memcpy(&bytes, next, 8);
        result = result * powerOf5(8) + hash8(bytes);
    }
    for (; next != end; ++next) {
        result = result * 5 + static_cast<std::uint32_t>(static_cast<signed char>(*next));
    }
    return result;
}

std::ostream& operator<<(std::ostream& stream, const LiString& text) {
    return stream << text.getChars();
}

std::istream& operator>>(std::istream& stream, LiString& text) {
    constexpr std::streamsize BUFFER_SIZE = 257;
    char buffer[BUFFER_SIZE] = "";
    const auto readPiece = [&] {
        stream.width(BUFFER_SIZE);
        stream >> buffer;
        return std::string_view(buffer);
    };
    LiStringImp::Ptr word = LiStringImp::create(readPiece());
    const std::locale locale = stream.getloc();
    while (stream.good()) {
        const auto next = stream.peek();
        if (!stream.good() || std::isspace(static_cast<char>(next), locale)) break;
        word->append(readPiece());
    }
    if (!stream.fail()) text._imp = std::move(word);
    return stream;
}

}  // namespace Orv
