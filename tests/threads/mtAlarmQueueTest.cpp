#include <gtest/gtest.h>
#include <map>
#include <random>
#include <vector>

#include "mtAlarmQueuePrivate.h"

namespace Orv {

namespace {

using Place = MtAlarmQueue::Place;

/// The queue and the plainest thing that does the same, side by side.
class QueueAndModel {
public:
    /// @return the alarm's number
    int add(double seconds) {
        const RCShdPtr<MtAlarmHandle> handle = MtAlarmHandle::create();
        _queue.makeRoom();
        const Place place = _queue.add(seconds, handle);
        _alarms.push_back({place, handle});
        list(_nbAdded++, seconds);
        return _nbAdded - 1;
    }

    void remove(int alarm) {
        const RCShdPtr<MtAlarmHandle> removed = _queue.remove(_alarms[alarm].place);
        EXPECT_EQ(removed, _alarms[alarm].handle);
        unlist(alarm);
    }

    /// Expects the same first alarm in both, and takes it.
    int takeFirst() {
        EXPECT_EQ(_queue.getNbAlarms(), _model.size());
        if (_queue.isEmpty() || _model.empty()) return -1;
        const double seconds = _queue.getFirstTime();
        EXPECT_EQ(seconds, _model.begin()->first.first);
        const int alarm = _model.begin()->second;
        EXPECT_EQ(_queue.takeFirst(), _alarms[alarm].place);
        EXPECT_EQ(_queue.getHandle(_alarms[alarm].place), _alarms[alarm].handle);
        unlist(alarm);
        return alarm;
    }

    void putBack(int alarm, double seconds) {
        _queue.putBack(_alarms[alarm].place, seconds);
        list(alarm, seconds);
    }

    bool isListed(int alarm) const { return _keys.count(alarm) > 0; }
    int getNbAdded() const { return _nbAdded; }
    bool isEmpty() const { return _model.empty(); }

private:
    struct Alarm {
        Place place;
        RCShdPtr<MtAlarmHandle> handle;
    };
    using Key = std::pair<double, long>;  // time, and the later the smaller

    MtAlarmQueue _queue;
    std::vector<Alarm> _alarms;
    std::map<Key, int> _model;
    std::map<int, Key> _keys;
    int _nbAdded = 0;
    long _nbListed = 0;

    void list(int alarm, double seconds) {
        _keys[alarm] = {seconds, -++_nbListed};
        _model[_keys[alarm]] = alarm;
    }

    void unlist(int alarm) {
        const auto key = _keys.find(alarm);
        if (key == _keys.end()) return;
        _model.erase(key->second);
        _keys.erase(key);
    }
};

TEST(MtAlarmQueue, amongEqualTimesTheLatestComesFirst) {
    QueueAndModel queue;
    for (const double seconds : {2.0, 1.0, 2.0, 0.0, -0.0, 1.0, 2.0}) queue.add(seconds);
    const int first = queue.takeFirst();
    EXPECT_EQ(first, 4);
    queue.putBack(first, 2.0);  // counts as the latest again
    for (const int expected : {3, 5, 1, 4, 6, 2, 0}) EXPECT_EQ(queue.takeFirst(), expected);
    EXPECT_TRUE(queue.isEmpty());
}

TEST(MtAlarmQueue, keepsItsOrderThroughAnyChanges) {
    std::mt19937 random(7);
    for (const int nbTimes : {3, 1000, 1'000'000}) {  // many equal times, few, none
        QueueAndModel queue;
        const auto drawTime = [&] { return static_cast<double>(random() % nbTimes); };
        for (int step = 0; step < 4000; ++step) {
            switch (random() % 4) {
                case 0:
                case 1:
                    queue.add(drawTime());
                    break;
                case 2: {
                    if (queue.getNbAdded() == 0) break;
                    const int alarm = static_cast<int>(random() % queue.getNbAdded());
                    if (queue.isListed(alarm)) queue.remove(alarm);
                    break;
                }
                default: {
                    const int alarm = queue.takeFirst();
                    if (alarm < 0) break;
                    if (random() % 2 == 0) {
                        queue.putBack(alarm, drawTime());
                    } else {
                        queue.remove(alarm);
                    }
                }
            }
        }
        while (!queue.isEmpty()) ASSERT_GE(queue.takeFirst(), 0);
    }
}

TEST(MtAlarmQueue, lettingAnAlarmGoLetsItsHandleGo) {
    MtAlarmQueue queue;
    RCShdPtr<MtAlarmHandle> handle = MtAlarmHandle::create();
    queue.makeRoom();
    const Place place = queue.add(1.0, handle);
    EXPECT_EQ(queue.getHandle(place), handle);
    handle.reset();
    const RCShdPtr<MtAlarmHandle> last = queue.remove(place);
    EXPECT_TRUE(queue.getHandle(place).isNull()) << "the place keeps nothing alive";
    EXPECT_FALSE(last.isNull());
}

}  // namespace

}  // namespace Orv
