#include <gtest/gtest.h>
#include <optional>
#include <random>
#include <string>

#include "devMgrEx.h"
#include "devMgrSyncSeqParser.h"
#include "expectThrows.h"

namespace Orv {

namespace {

/// "-a a-b": a leads b.
std::string describe(const std::vector<DevMgrSyncSeqParser::Edge>& edges) {
    std::string text;
    for (const auto& [parent, child] : edges) {
        if (!text.empty()) text += " ";
        text.append(parent.getText()).append("-").append(child.getText());
    }
    return text;
}

/// The same by descent, written after the grammar:
///   string  "(" name [ group { member } ] ")"     member  name [ group ]     group  "(" member+ ")"
class Reference {
public:
    static std::optional<std::string> parse(const std::string& text) {
        Reference reference(text);
        if (!reference.parseString()) return std::nullopt;
        return reference._edges;
    }

private:
    std::vector<std::string> _tokens;
    std::size_t _next = 0;
    std::string _edges;

    explicit Reference(const std::string& text) {
        std::string name;
        for (const char c : text + " ") {
            const bool isParenthesis = c == '(' || c == ')';
            if (!isParenthesis && std::isspace(static_cast<unsigned char>(c)) == 0) {
                name += c;
                continue;
            }
            if (!name.empty()) _tokens.push_back(name);
            name.clear();
            if (isParenthesis) _tokens.emplace_back(1, c);
        }
    }

    bool isNext(const std::string& token) const {
        return _next < _tokens.size() && _tokens[_next] == token;
    }
    bool take(const std::string& token) {
        if (!isNext(token)) return false;
        ++_next;
        return true;
    }
    std::optional<std::string> takeName(const std::string& parent) {
        if (_next == _tokens.size() || isNext("(") || isNext(")")) return std::nullopt;
        _edges += (_edges.empty() ? "" : " ") + parent + "-" + _tokens[_next];
        return _tokens[_next++];
    }
    bool parseString() {
        if (!take("(")) return false;
        const auto root = takeName("");
        if (!root) return false;
        if (isNext("(")) {
            if (!parseGroup(*root)) return false;
            while (!isNext(")")) {
                if (!parseMember("")) return false;
            }
        }
        return take(")") && _next == _tokens.size();
    }
    bool parseMember(const std::string& parent) {
        const auto name = takeName(parent);
        return name && (!isNext("(") || parseGroup(*name));
    }
    bool parseGroup(const std::string& parent) {
        if (!take("(") || !parseMember(parent)) return false;
        while (!isNext(")")) {
            if (!parseMember(parent)) return false;
        }
        return take(")");
    }
};

TEST(DevMgrSyncSeqParser, readsTrees) {
    const std::pair<const char*, const char*> rows[] = {
        {"(mixer)", "-mixer"},
        {"(clock (deckA deckB (fx)))", "-clock clock-deckA clock-deckB deckB-fx"},
        {"(clock (deckA) render)", "-clock clock-deckA -render"},
        {"(a (b) c (d) e)", "-a a-b -c c-d -e"},
        {"(a (b (c) d) e)", "-a a-b b-c a-d -e"},
        {" \t(\na\v(\fb\r)\n)\n", "-a a-b"},
        {"(a(b)c)", "-a a-b -c"},
        {"(a:1 (\xE4-b))", "-a:1 a:1-\xE4-b"},
    };
    for (const auto& [text, edges] : rows) {
        EXPECT_EQ(describe(DevMgrSyncSeqParser(text).getEdges()), edges) << text;
        EXPECT_EQ(Reference::parse(text), edges) << text;
    }
}

TEST(DevMgrSyncSeqParser, refusesWhatIsWrongInEveryState) {
    const std::pair<const char*, std::vector<const char*>> rows[] = {
        {"begin", {"", " ", ")", "a", "a (b)"}},
        {"root", {"(", "()", "((", "( )"}},
        {"after the root", {"(a", "(a b)", "(clock deckA)", "(a b (c))"}},
        {"group", {"(a (", "(a ()", "(a (()))", "(a (b) c ()"}},
        {"after a name", {"(a (b", "(a (b)", "(a (b c", "(a (b) c", "(a (b (c)"}},
        {"after closing", {"(a) (b)", "(clock (deckA) (deckB))", "(a (b))(c)", "(a (b (c) (d)))"}},
        {"too many closed", {"(a))", "(a) b", "(a) b)", "(a (b)) c)", "(a))b)", "(a))) b (c)))"}},
    };
    for (const auto& [state, texts] : rows) {
        for (const char* const text : texts) {
            SCOPED_TRACE(std::string(state) + ": " + text);
            EXPECT_FALSE(Reference::parse(text));
            expectThrows<DevMgrEx::ConfigSyntaxError>("Configuration string Syntax error.",
                                                      [&] { DevMgrSyncSeqParser parser(text); });
        }
    }
}

TEST(DevMgrSyncSeqParser, agreesWithTheGrammarOnRandomStrings) {
    std::mt19937 random(2026);
    const std::string tokens[] = {"(", ")", "(", ")", "a", "b ", " ", "\t", "c(", ")("};
    int nbAccepted = 0;
    for (int i = 0; i < 100000; ++i) {
        std::string text = random() % 4 == 0 ? "" : "(a";
        for (auto n = random() % 12; n > 0; --n) text += tokens[random() % std::size(tokens)];
        if (random() % 2 == 0) text += ")";
        std::optional<std::string> edges;
        try {
            edges = describe(DevMgrSyncSeqParser(text).getEdges());
            ++nbAccepted;
        } catch (const DevMgrEx::ConfigSyntaxError&) {
        }
        ASSERT_EQ(edges, Reference::parse(text)) << text;
    }
    EXPECT_GT(nbAccepted, 1000);
}

TEST(DevMgrSyncSeqParser, readsDeepTreesWithoutDeepCalls) {
    constexpr int depth = 100000;
    std::string text;
    for (int i = 0; i < depth; ++i) text += "(n";
    text += std::string(depth, ')');
    EXPECT_EQ(DevMgrSyncSeqParser(text).getEdges().size(), static_cast<std::size_t>(depth));
    text.pop_back();
    EXPECT_THROW(DevMgrSyncSeqParser{text}, DevMgrEx::ConfigSyntaxError);
}

}  // namespace

}  // namespace Orv
