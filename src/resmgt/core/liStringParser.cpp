#include "liStringParser.h"

#include <istream>

namespace Orv {

namespace {

LiString readQuoted(std::istream& stream) {
    LiString token;
    char character = '\0';
    while (stream.get(character)) {
        if (character == '"') return token;
        token += character;
    }
    return LiString();  // get() has set the fail flag
}

}  // namespace

LiString LiStringParser::readToken(std::istream& stream) const {
    char first = '\0';
    if (!(stream >> first)) return LiString();
    if (first == '"') return readQuoted(stream);
    stream.putback(first);
    LiString word;
    stream >> word;
    return word;
}

}  // namespace Orv
