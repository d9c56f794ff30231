#pragma once

#include <algorithm>
#include <cstddef>
#include <gtest/gtest.h>
#include <iterator>
#include <mutex>
#include <random>
#include <stdexcept>
#include <streambuf>
#include <string>
#include <utility>

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

    /// Characters 0x20 to 0x7E and, if wanted, such of Unicode that need two to four bytes.
    std::string text(unsigned nbCharacters, bool isAscii) {
        // The first and last ones of each length that XML allows.
        static const char* const LONG[] = {"\u00A0", "\u07FF",     "\u0800",     "\uD7FF",
                                           "\uE000", "\U0000FFFD", "\U00010000", "\U0010FFFF"};
        std::string result;
        for (unsigned i = 0; i < nbCharacters; ++i) {
            if (below(4) == 0) {
                result += "\"&'<>"[below(5)];
            } else if (isAscii || below(2) == 0) {
                result += static_cast<char>(0x20 + below(0x7F - 0x20));
            } else {
                result += LONG[below(std::size(LONG))];
            }
        }
        return result;
    }

private:
    std::mt19937 _engine;
};

/// The escaped form, made the simplest way.
inline std::string xmlEscaped(const std::string& text) {
    static const std::pair<char, const char*> ENTITIES[] = {
        {'"', "&quot;"}, {'&', "&amp;"}, {'\'', "&apos;"}, {'<', "&lt;"}, {'>', "&gt;"}};
    std::string result;
    for (const char character : text) {
        std::string piece(1, character);
        for (const auto& [special, entity] : ENTITIES)
            if (character == special) piece = entity;
        result += piece;
    }
    return result;
}

}  // namespace Orv
