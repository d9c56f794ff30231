#include <gtest/gtest.h>
#include <random>
#include <set>
#include <string>

#include "devMgrEx.h"
#include "devMgrPropertyParser.h"
#include "devMgrStreamParser.h"
#include "expectThrows.h"

namespace Orv {

namespace {

TEST(DevMgrPropertyParser, readsDeviceSetsAndProperty) {
    struct Row {
        const char* text;
        const char* device;
        std::string sets;
        const char* property;
    };
    for (const Row& row : {
             Row{"mixer:gain", "mixer", "", "gain"},
             Row{"mixer : gain", "mixer", "", "gain"},
             Row{"\t mixer\n:\vgain\f\r", "mixer", "", "gain"},
             Row{"mixer:channel1:eq:gain", "mixer", "channel1 eq ", "gain"},
             Row{"mixer::", "mixer", "", ":"},
             Row{"m(x:g)n", "m(x", "", "g)n"},
             Row{"\xE4:\xF6", "\xE4", "", "\xF6"},
         }) {
        const DevMgrPropertyParser parser(row.text);
        EXPECT_EQ(parser.getDeviceName(), row.device) << row.text;
        EXPECT_EQ(parser.getPropertyName(), row.property) << row.text;
        std::string sets;
        for (const LiString& set : parser.getPropertySetPath()) {
            sets.append(set.getText()).append(" ");
        }
        EXPECT_EQ(sets, row.sets) << row.text;
    }
}

TEST(DevMgrPropertyParser, saysHowFarItCameAndWhatItExpected) {
    struct Row {
        const char* text;
        const char* error;
    };
    for (const Row& row : {
             Row{"", "[ unexpected end of tokens ]"},
             Row{" \t ", "[ unexpected end of tokens ]"},
             Row{":gain", "[ expected device name ]"},
             Row{"mixer", "mixer [ unexpected end of tokens ]"},
             Row{"mixer gain", "mixer [ expected colon after device name ]"},
             Row{"mixer:", "mixer : [ unexpected end of tokens ]"},
             Row{"mixer:gain:", "mixer : gain : [ unexpected end of tokens ]"},
             Row{"mixer:gain extra", "mixer : gain [ expected colon after property set name ]"},
             Row{"mixer::gain", "mixer : : [ expected colon after property set name ]"},
             Row{"100%s:a b", "100%s : a [ expected colon after property set name ]"},
         }) {
        expectThrows<DevMgrEx::PropertySyntaxError>(row.error,
                                                    [&] { DevMgrPropertyParser parser(row.text); });
    }
}

TEST(DevMgrStreamParser, readsBothEndsAndTheVerb) {
    struct Row {
        const char* text;
        const char* parts;
        DevMgrStreamParser::Verb verb;
    };
    for (const Row& row : {
             Row{"camera:video push display:input", "camera/video/display/input",
                 DevMgrStreamParser::PUSH},
             Row{"camera : video pull display : input", "camera/video/display/input",
                 DevMgrStreamParser::PULL},
             Row{":video push :input", "/video//input", DevMgrStreamParser::PUSH},
             Row{":video pull display:input", "/video/display/input", DevMgrStreamParser::PULL},
             Row{"push:pull push pull:push", "push/pull/pull/push", DevMgrStreamParser::PUSH},
             Row{":: push ::", "/://:", DevMgrStreamParser::PUSH},
         }) {
        const DevMgrStreamParser parser(row.text);
        const LiString parts = parser.getSourceDevice() + '/' + parser.getSourceStream() + '/' +
                               parser.getSinkDevice() + '/' + parser.getSinkStream();
        EXPECT_EQ(parts, row.parts) << row.text;
        EXPECT_EQ(parser.getVerb(), row.verb) << row.text;
    }
}

TEST(DevMgrStreamParser, saysHowFarItCameAndWhatItExpected) {
    struct Row {
        const char* text;
        const char* error;
    };
    for (const Row& row : {
             Row{"", "[ unexpected end of tokens ]"},
             Row{"camera", "camera [ unexpected end of tokens ]"},
             Row{":", ": [ unexpected end of tokens ]"},
             Row{"camera video", "camera [ expected first colon ]"},
             Row{"camera:video", "camera : video [ unexpected end of tokens ]"},
             Row{"camera:video copy display:input", "camera : video [ expected pull/push verb ]"},
             Row{"camera:video Push display:input", "camera : video [ expected pull/push verb ]"},
             Row{"camera:video pull", "camera : video pull [ unexpected end of tokens ]"},
             Row{"camera:video pull display",
                 "camera : video pull display [ unexpected end of tokens ]"},
             Row{"camera:video pull display input",
                 "camera : video pull display [ expected second colon ]"},
             Row{"camera:video pull display:",
                 "camera : video pull display : [ unexpected end of tokens ]"},
             Row{"camera:video pull display:input extra",
                 "camera : video pull display : input [ more tokens than expected ]"},
         }) {
        expectThrows<DevMgrEx::ConfigSyntaxError>(row.error,
                                                  [&] { DevMgrStreamParser parser(row.text); });
    }
}

/// Random strings of words that the grammars know, of which some parse and all others throw what
/// is documented.
template <class Parser, class Error>
void parseAnything() {
    std::mt19937 random(4711);
    const char* const words[] = {":",  " ",  "a", "push", "pull", "mixer",
                                 "::", "\n", "(", ")",    "%s"};
    int nbParsed = 0;
    std::set<std::string> errors;
    for (int i = 0; i < 100000; ++i) {
        std::string text;
        for (auto nb = random() % 12; nb > 0; --nb) {
            text += random() % 8 != 0 ? words[random() % std::size(words)]
                                      : std::string(1, static_cast<char>(random() % 255 + 1));
        }
        try {
            const Parser parser{LiString(text)};
            ++nbParsed;
        } catch (const Error& error) {
            const std::string reason = error.what();
            ASSERT_EQ(reason.substr(reason.size() - 2), " ]") << text;
            errors.insert(reason.substr(reason.rfind("[ ")));
        }
    }
    EXPECT_GT(nbParsed, 100);
    EXPECT_GE(errors.size(), 4U);
}

TEST(DevMgrPropertyParser, readsOrRefusesAnyText) {
    parseAnything<DevMgrPropertyParser, DevMgrEx::PropertySyntaxError>();
}

TEST(DevMgrStreamParser, readsOrRefusesAnyText) {
    parseAnything<DevMgrStreamParser, DevMgrEx::ConfigSyntaxError>();
}

}  // namespace

}  // namespace Orv
