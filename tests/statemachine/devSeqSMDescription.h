#pragma once

#include "devSMDescription.h"

namespace Orv {

/// The machine that drives a node of a synchronised sequence.
inline DevSMDescription makeDevSeqSMDescription() {
    DevSMDescription machine;
    machine.states = {"init", "start",   "wsr", "ready", "wml",   "sync",
                      "lock", "recover", "wss", "stop",  "abort", "final"};
    machine.events = {"start",   "ready", "sready",  "proceed",  "lock",  "mlock",
                      "recover", "stop",  "stopped", "sstopped", "abort", "aborted"};
    machine.transitions = {"start", "psready", "wsr",     "wsrret",  "ready",  "wml",
                           "sync",  "lock",    "recover", "wss",     "wssret", "stop",
                           "pstop", "stopped", "abort",   "aborted", "ignore"};
    machine.pairs = {{"init", "start", {"start"}},
                     {"start", "ready", {"ready", "wsr"}},
                     {"start", "sready", {"psready"}},
                     {"start", "stop", {"pstop"}},
                     {"wsr", "sready", {"wsrret", "ready"}},
                     {"wsr", "stop", {"pstop"}},
                     {"ready", "proceed", {"sync", "wml"}},
                     {"ready", "stop", {"pstop"}},
                     {"wml", "mlock", {"sync"}},
                     {"wml", "stop", {"pstop"}},
                     {"sync", "lock", {"lock"}},
                     {"sync", "stop", {"pstop"}},
                     {"lock", "stop", {"stop", "wss"}},
                     {"lock", "recover", {"recover"}},
                     {"lock", "sready", {"lock"}},
                     {"lock", "mlock", {"ignore"}},
                     {"recover", "ready", {"ready", "wsr"}},
                     {"recover", "sready", {"psready"}},
                     {"recover", "stop", {"pstop"}},
                     {"wss", "sstopped", {"wssret", "stop"}},
                     {"stop", "stopped", {"stopped"}},
                     {"abort", "aborted", {"aborted"}}};
    machine.nextStates = {{"init", "start", "start"},        {"start", "ready", "ready"},
                          {"start", "wsr", "wsr"},           {"start", "psready", "start"},
                          {"start", "pstop", "start"},       {"wsr", "wsrret", "wsr"},
                          {"wsr", "ready", "ready"},         {"wsr", "pstop", "wsr"},
                          {"ready", "sync", "sync"},         {"ready", "wml", "wml"},
                          {"ready", "pstop", "ready"},       {"wml", "sync", "sync"},
                          {"wml", "pstop", "wml"},           {"sync", "lock", "lock"},
                          {"sync", "pstop", "sync"},         {"lock", "wss", "wss"},
                          {"lock", "stop", "stop"},          {"lock", "recover", "recover"},
                          {"lock", "lock", "lock"},          {"lock", "ignore", "lock"},
                          {"recover", "wsr", "wsr"},         {"recover", "ready", "ready"},
                          {"recover", "psready", "recover"}, {"recover", "pstop", "recover"},
                          {"wss", "wssret", "wss"},          {"wss", "stop", "stop"},
                          {"stop", "stopped", "final"},      {"abort", "aborted", "final"}};
    machine.conditions = {{"wsrret", {"wsrret", "ready"}},
                          {"ready", {"ready", "wsr"}},
                          {"sync", {"sync", "wml"}},
                          {"wssret", {"wssret", "stop"}},
                          {"stop", {"stop", "wss"}}};
    for (const char* const state :
         {"start", "wsr", "ready", "wml", "sync", "lock", "recover", "wss", "stop"}) {
        machine.pairs.push_back({state, "abort", {"abort"}});
        machine.nextStates.push_back({state, "abort", "abort"});
    }
    for (const char* const event : {"ready", "sready", "proceed", "lock", "mlock", "recover",
                                    "stop", "stopped", "sstopped", "abort"}) {
        machine.pairs.push_back({"abort", event, {"ignore"}});
    }
    machine.nextStates.push_back({"abort", "ignore", "abort"});
    return machine;
}

}  // namespace Orv
