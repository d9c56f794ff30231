#pragma once

#include <algorithm>
#include <cstddef>
#include <gtest/gtest.h>
#include <mutex>
#include <random>
#include <stdexcept>
#include <streambuf>
#include <string>

#include "lgSink.h"
#include "traceManager.h"

namespace Orv {

/// Takes so many characters and then refuses, or throws.
class XmlLimitedBuffer : public std::streambuf {
public:
    struct Full : std::runtime_error {
        Full() : std::runtime_error("the disk is full") {}
    };

    XmlLimitedBuffer(std::size_t limit, bool throws) : _limit(limit), _throws(throws) {}

    std::string taken;

protected:
    std::streamsize xsputn(const char* chars, std::streamsize count) override {
        const std::size_t nbTaken =
            std::min(static_cast<std::size_t>(count), _limit - taken.size());
        taken.append(chars, nbTaken);
        if (nbTaken < static_cast<std::size_t>(count) && _throws) throw Full();
        return static_cast<std::streamsize>(nbTaken);
    }

    int_type overflow(int_type character) override {
        const char single = traits_type::to_char_type(character);
        return xsputn(&single, 1) == 1 ? character : traits_type::eof();
    }

private:
    std::size_t _limit;
    bool _throws;
};

/// Collects what is traced meanwhile, in place of standard error.
class XmlTraceCollector {
public:
    XmlTraceCollector() {
        TraceManager::getInstance().setStandardErrorOn(false);
        TraceManager::getInstance().addSink(_sink);
    }

    ~XmlTraceCollector() {
        TraceManager::getInstance().removeSink(*_sink);
        TraceManager::getInstance().setStandardErrorOn(true);
    }

    std::string getText() {
        EXPECT_TRUE(TraceManager::getInstance().flush());
        const std::lock_guard guard(_sink->mutex);
        return _sink->text;
    }

private:
    struct Sink : LgSink {
        std::mutex mutex;
        std::string text;

        void write(const LgRecord& record, const LgThread&) override {
            const std::lock_guard guard(mutex);
            text.append(record.text).append("\n");
        }
        void flush() override {}
        std::string getName() const override { return "xml test"; }
    };

    std::shared_ptr<Sink> _sink = std::make_shared<Sink>();
};

/// Deterministic random numbers and texts.
class XmlRandom {
public:
    explicit XmlRandom(unsigned seed) : _engine(seed) {}

    unsigned below(unsigned end) {
        return std::uniform_int_distribution<unsigned>(0, end - 1)(_engine);
    }

    /// Characters 0x20 to 0x7E and, if wanted, any others of Unicode that XML allows, as UTF-8.
    std::string text(unsigned nbCharacters, bool isAscii) {
        std::string result;
        for (unsigned i = 0; i < nbCharacters; ++i) {
            if (below(4) == 0) {
                result += "\"&'<>"[below(5)];
            } else if (isAscii || below(2) == 0) {
                result += static_cast<char>(0x20 + below(0x7F - 0x20));
            } else {
                appendUtf8(result);
            }
        }
        return result;
    }

private:
    std::mt19937 _engine;

    void appendUtf8(std::string& text) {
        static constexpr unsigned RANGES[][2] = {
            {0xA0, 0x7FF}, {0x800, 0xD7FF}, {0xE000, 0xFFFD}, {0x10000, 0x10FFFF}};
        const auto [first, last] = RANGES[below(4)];
        const unsigned code = first + below(last - first + 1);
        const auto put = [&](unsigned bits) { text += static_cast<char>(bits); };
        if (code < 0x800) {
            put(0xC0 | code >> 6);
        } else {
            if (code < 0x10000) {
                put(0xE0 | code >> 12);
            } else {
                put(0xF0 | code >> 18);
                put(0x80 | (code >> 12 & 0x3F));
            }
            put(0x80 | (code >> 6 & 0x3F));
        }
        put(0x80 | (code & 0x3F));
    }
};

/// The escaped form, made the simplest way.
inline std::string xmlEscaped(const std::string& text) {
    std::string result;
    for (const char character : text) {
        if (character == '"') {
            result += "&quot;";
        } else if (character == '&') {
            result += "&amp;";
        } else if (character == '\'') {
            result += "&apos;";
        } else if (character == '<') {
            result += "&lt;";
        } else if (character == '>') {
            result += "&gt;";
        } else {
            result += character;
        }
    }
    return result;
}

}  // namespace Orv
