// Boost's two libraries of state machines on the machine of machinePath.h. Compiled as C++17: one of
// them is not valid C++20.
#define BOOST_MPL_CFG_NO_PREPROCESSED_HEADERS
#define BOOST_MPL_LIMIT_LIST_SIZE 30
#define BOOST_MPL_LIMIT_VECTOR_SIZE 30
#define FUSION_MAX_VECTOR_SIZE 20
#include <boost/mpl/list.hpp>
#include <boost/mpl/vector.hpp>
#include <boost/msm/back/state_machine.hpp>
#include <boost/msm/front/functor_row.hpp>
#include <boost/msm/front/state_machine_def.hpp>
#include <boost/statechart/event.hpp>
#include <boost/statechart/simple_state.hpp>
#include <boost/statechart/state_machine.hpp>
#include <boost/statechart/transition.hpp>

#include "machinePath.h"

namespace {

using machine::SIZE;

/// The number of an event as one of the types that both libraries want.
template <template <int> class Event, class Machine>
void dispatch(Machine& target, int event) {
    // clang-format off
    switch (event) {
#define ORV_BENCH_EVENT(i) case i: target.process_event(Event<i>()); break;
        ORV_BENCH_EVENT(0) ORV_BENCH_EVENT(1) ORV_BENCH_EVENT(2) ORV_BENCH_EVENT(3)
        ORV_BENCH_EVENT(4) ORV_BENCH_EVENT(5) ORV_BENCH_EVENT(6) ORV_BENCH_EVENT(7)
        ORV_BENCH_EVENT(8) ORV_BENCH_EVENT(9) ORV_BENCH_EVENT(10) ORV_BENCH_EVENT(11)
#undef ORV_BENCH_EVENT
    }
    // clang-format on
}

namespace sc = boost::statechart;

template <int I>
struct ChartEvent : sc::event<ChartEvent<I>> {};

template <int I>
struct ChartState;

struct Chart : sc::state_machine<Chart, ChartState<0>> {
    template <class Event>
    void act(const Event&) {
        machine::action->run();
    }
    void start() { initiate(); }
    bool fire(int event) {
        dispatch<ChartEvent>(*this, event);
        return true;
    }
};

template <int I>
struct ChartState : sc::simple_state<ChartState<I>, Chart> {
    template <int E, int To>
    using Row =
        sc::transition<ChartEvent<E>, ChartState<To>, Chart, &Chart::template act<ChartEvent<E>>>;
    using reactions = boost::mpl::list<Row<I, (I + 1) % SIZE>, Row<(I + 3) % SIZE, (I + 5) % SIZE>>;
};

namespace msm = boost::msm;

template <int I>
struct MsmEvent {};

template <int I>
struct MsmState : msm::front::state<> {};

struct MsmAction {
    template <class Event, class Machine, class Source, class Target>
    void operator()(const Event&, Machine&, Source&, Target&) {
        machine::action->run();
    }
};

struct MsmFront : msm::front::state_machine_def<MsmFront> {
    using initial_state = MsmState<0>;
    using no_exception_thrown = int;
    using no_message_queue = int;
    template <int S, int E, int To>
    using Row =
        msm::front::Row<MsmState<S>, MsmEvent<E>, MsmState<To>, MsmAction, msm::front::none>;
    template <int S>
    using Next = Row<S, S, (S + 1) % SIZE>;
    template <int S>
    using Hop = Row<S, (S + 3) % SIZE, (S + 5) % SIZE>;
    struct transition_table
        : boost::mpl::vector<Next<0>, Hop<0>, Next<1>, Hop<1>, Next<2>, Hop<2>, Next<3>, Hop<3>,
                             Next<4>, Hop<4>, Next<5>, Hop<5>, Next<6>, Hop<6>, Next<7>, Hop<7>,
                             Next<8>, Hop<8>, Next<9>, Hop<9>, Next<10>, Hop<10>, Next<11>,
                             Hop<11>> {};
};

struct Msm : msm::back::state_machine<MsmFront> {
    bool fire(int event) {
        dispatch<MsmEvent>(*this, event);
        return true;
    }
};

BENCHMARK(machine::follow<Msm>)->Name("event/boost::msm");
BENCHMARK(machine::follow<Chart>)->Name("event/boost::statechart");

}  // namespace
