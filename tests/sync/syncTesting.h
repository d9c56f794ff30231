#pragma once

#include <cstdint>
#include <functional>
#include <gtest/gtest.h>
#include <memory>
#include <mutex>
#include <ostream>
#include <vector>

#include "gate.h"
#include "seSourceStepped.h"
#include "seSyncEngine.h"

namespace Orv {

struct Beat {
    std::uint32_t tick;
    std::uint32_t lateTicks;

    friend bool operator==(const Beat&, const Beat&) = default;
    friend std::ostream& operator<<(std::ostream& stream, const Beat& beat) {
        return stream << '{' << beat.tick << ", " << beat.lateTicks << '}';
    }
};

using Beats = std::vector<Beat>;

/// What became of a client; outlives it.
class ClientRecord {
public:
    TestCounter nbStarts, nbBeats, nbEnds, nbDestroyed;

    void add(const Beat& beat) {
        {
            const std::lock_guard guard(_mutex);
            _beats.push_back(beat);
        }
        nbBeats.add();
    }

    Beats getBeats() const {
        const std::lock_guard guard(_mutex);
        return _beats;
    }

private:
    mutable std::mutex _mutex;
    Beats _beats;
};

/// A client that records what is called, and beats as told to.
class TestClient : public SeClientThread {
public:
    using OnBeat = std::function<bool(const Beat&)>;

    explicit TestClient(ClientRecord& record, OnBeat onBeat = nullptr)
        : _record(record), _onBeat(std::move(onBeat)) {}
    ~TestClient() noexcept(false) override { _record.nbDestroyed.add(); }

    std::function<void()> onStart, onEnd;
    MtThread* thread = nullptr;

    void performAttach(MtThread* attached) override {
        thread = attached;
        SeClientThread::performAttach(attached);
    }

protected:
    void performStart() override {
        _record.nbStarts.add();
        if (onStart) onStart();
    }
    bool performBeat(std::uint32_t tick, std::uint32_t lateTicks) override {
        const Beat beat{tick, lateTicks};
        _record.add(beat);
        return _onBeat && _onBeat(beat);
    }
    void performEnd() override {
        _record.nbEnds.add();
        if (onEnd) onEnd();
    }

private:
    ClientRecord& _record;
    OnBeat _onBeat;
};

/// An engine with a stepped source, for exact tests: each step is over before the next.
class SteppedEngine {
public:
    SeSourceStepped source{"stepped"};
    SeSyncEngine engine;

    TestClient* add(ClientRecord& record, int divider = 1, TestClient::OnBeat onBeat = nullptr) {
        ObjPtr<SeClientThread> client(new TestClient(record, std::move(onBeat)));
        auto* const added = static_cast<TestClient*>(client.get());
        engine.addClient("client", client, source, divider);
        return added;
    }

    /// Ticks, and waits until every client has done with it.
    std::uint32_t step(std::uint32_t nbTicks = 1) {
        const std::uint32_t tick = source.step(nbTicks);
        waitDone(tick);
        return tick;
    }

    void steps(int number) {
        for (int i = 0; i < number; ++i) step();
    }

    void waitDone(std::uint32_t tick) {
        EXPECT_TRUE(engine.waitTickDone(source, tick, getWaitLimitSeconds()))
            << "tick " << tick << " is not over";
    }
};

}  // namespace Orv
