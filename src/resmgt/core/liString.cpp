#include "liString.h"

#include <emmintrin.h>  // SSE2, which every processor of the supported platforms has
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

// The hashes of sixteen characters, those of the first eight in the lower half and those of the
// last eight in the upper. Neighbours are joined to pairs, pairs to fours and these to eights, all
// signed.
std::uint64_t hashEights(__m128i characters) {
    const __m128i by5 = _mm_set1_epi32(1 << 16 | powerOf5(1));
    const __m128i by25 = _mm_set1_epi32(1 << 16 | powerOf5(2));
    const __m128i by625 = _mm_set1_epi32(1 << 16 | powerOf5(4));
    const __m128i first = _mm_srai_epi16(_mm_unpacklo_epi8(characters, characters), 8);
    const __m128i last = _mm_srai_epi16(_mm_unpackhi_epi8(characters, characters), 8);
    const __m128i pairs = _mm_packs_epi32(_mm_madd_epi16(first, by5), _mm_madd_epi16(last, by5));
    const __m128i fours = _mm_madd_epi16(pairs, by25);  // at most 128 * 156, so 16 bits hold them
    const __m128i eights = _mm_madd_epi16(_mm_packs_epi32(fours, fours), by625);
    return static_cast<std::uint64_t>(_mm_cvtsi128_si64(eights));
}

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
    for (; end - next >= 16; next += 16) {
        __m128i characters;
        std::memcpy(&characters, next, 16);
        const std::uint64_t eights = hashEights(characters);
        result = result * powerOf5(16) + static_cast<std::uint32_t>(eights) * powerOf5(8) +
                 static_cast<std::uint32_t>(eights >> 32);
    }
    if (end - next >= 8) {
        std::int64_t characters = 0;
        std::memcpy(&characters, next, 8);
        const std::uint64_t eights = hashEights(_mm_cvtsi64_si128(characters));
        result = result * powerOf5(8) + static_cast<std::uint32_t>(eights);
        next += 8;
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
