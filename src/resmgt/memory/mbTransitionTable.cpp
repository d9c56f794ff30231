#include <ostream>
#include <string>

#include "mbTransitionTablePrivate.h"

namespace Orv {

namespace {

constexpr MbCell ign = MbReaction::IGNORE;
constexpr MbCell ILL = MbReaction::ILLEGAL;
constexpr MbCell wait = MbReaction::WAIT;
constexpr MbCell pend = MbReaction::PEND;
constexpr MbCell up = MbReaction::COUNT_UP;
constexpr MbCell touch = MbReaction::TOUCH;

constexpr MbCell down(MbStateId next) {
    return {MbReaction::COUNT_DOWN, next};
}

using enum MbStateId;

#define ROW(state) state, #state

// clang-format off
// A thread is at the protocol: who wants the contents waits.
//       rdlock           wrlock           wrdup  prefetch            asyncSync          sync
//       unlock               unload         free           destroy         asyncOpSucceeded      asyncOpFailed
constexpr MbCells BUSY = {
         wait,            wait,            ILL,   ign,                pend,              wait,
         ILL,                 ign,           pend,          ILL,            ILL,                  ILL};
// It starts an asynchronous operation, which may report at once.
constexpr MbCells STARTING = {
         wait,            wait,            ILL,   ign,                pend,              wait,
         ILL,                 ign,           pend,          ILL,            pend,                 pend};

// Each row: the state, where its own action leads, and what it does about each event.
constexpr MbStateRow TABLE[NB_MB_STATES] = {
    //   rdlock           wrlock           wrdup  prefetch            asyncSync          sync
    //   unlock               unload         free           destroy         asyncOpSucceeded      asyncOpFailed
    {ROW(Freed), NONE,
        {BeingRdLoaded,   BeingWrLoaded,   ILL,   BeingAsyncLoaded,   ign,               ign,
         ILL,                 ign,           ign,           Destroyed,      ILL,                  ILL}},
    {ROW(Unloaded), NONE,
        {BeingRdReloaded, BeingWrReloaded, ILL,   BeingAsyncReloaded, ign,               ign,
         ILL,                 ign,           Freed,         Destroyed,      ILL,                  ILL}},
    {ROW(Loaded), NONE,
        {RdLocked,        WrLocked,        ILL,   touch,              BeingAsyncSynched, BeingSynched,
         ILL,                 BeingUnloaded, BeingFreed,    BeingDestroyed, ILL,                  ILL}},
    {ROW(Synched), NONE,
        {RdLocked,        WrLocked,        ILL,   touch,              ign,               ign,
         ILL,                 BeingUnloaded, BeingFreed,    Destroyed,      ILL,                  ILL}},
    {ROW(RdLocked), NONE,
        {up,              wait,            ILL,   ign,                pend,              wait,
         down(BeingUnlocked), ign,           RdLockedFreed, ILL,            ILL,                  ILL}},
    {ROW(WrLocked), NONE,
        {wait,            wait,            up,    ign,                pend,              wait,
         down(BeingUnlocked), ign,           WrLockedFreed, ILL,            ILL,                  ILL}},
    {ROW(RdLockedFreed), NONE,
        {up,              wait,            ILL,   ign,                ign,               ign,
         down(BeingFreed),    ign,           ign,           ILL,            ILL,                  ILL}},
    {ROW(WrLockedFreed), NONE,
        {wait,            wait,            up,    ign,                ign,               ign,
         down(BeingFreed),    ign,           ign,           ILL,            ILL,                  ILL}},
    {ROW(Destroyed), NONE,
        {ILL,             ILL,             ILL,   ILL,                ILL,               ILL,
         ILL,                 ign,           ILL,           ILL,            ILL,                  ILL}},

    {ROW(BeingRdLoaded), RdLocked, BUSY},
    {ROW(BeingWrLoaded), WrLocked, BUSY},
    {ROW(BeingRdReloaded), RdLocked, BUSY},
    {ROW(BeingWrReloaded), WrLocked, BUSY},
    {ROW(BeingSynched), Synched, BUSY},
    {ROW(BeingUnlocked), Loaded, BUSY},
    {ROW(BeingAsyncLoaded), WaitAsyncLoaded, STARTING},
    {ROW(BeingAsyncReloaded), WaitAsyncReloaded, STARTING},
    {ROW(BeingAsyncSynched), WaitAsyncSynched, STARTING},

    {ROW(WaitAsyncLoaded), NONE,
        {wait,            wait,            ILL,   ign,                pend,              wait,
         ILL,                 ign,           pend,          pend,           AsyncLoadSucceeded,   AsyncLoadFailed}},
    {ROW(WaitAsyncReloaded), NONE,
        {wait,            wait,            ILL,   ign,                pend,              wait,
         ILL,                 ign,           pend,          pend,           AsyncReloadSucceeded, AsyncReloadFailed}},
    {ROW(WaitAsyncSynched), NONE,
        {wait,            wait,            ILL,   ign,                pend,              wait,
         ILL,                 ign,           pend,          pend,           AsyncSyncSucceeded,   AsyncSyncFailed}},
    {ROW(BeingUnloaded), Unloaded,
        {wait,            wait,            ILL,   pend,               pend,              wait,
         ILL,                 ign,           pend,          pend,           ILL,                  ILL}},
    {ROW(BeingFreed), Freed,
        {wait,            wait,            ILL,   pend,               ign,               ign,
         ILL,                 ign,           ign,           pend,           ILL,                  ILL}},
    {ROW(BeingDestroyed), Destroyed,
        {ILL,             ILL,             ILL,   ILL,                ILL,               ILL,
         ILL,                 ign,           ILL,           ILL,            ILL,                  ILL}},

    {ROW(AsyncLoadSucceeded), Loaded, BUSY},
    {ROW(AsyncLoadFailed), Freed, BUSY},
    {ROW(AsyncReloadSucceeded), Loaded, BUSY},
    {ROW(AsyncReloadFailed), Unloaded, BUSY},
    {ROW(AsyncSyncSucceeded), Synched, BUSY},
    {ROW(AsyncSyncFailed), Loaded, BUSY},
};
// clang-format on

#undef ROW

constexpr bool isInOrder() {
    for (std::size_t i = 0; i < NB_MB_STATES; ++i) {
        if (TABLE[i].id != static_cast<MbStateId>(i)) return false;
    }
    return true;
}
static_assert(isInOrder(), "a row stands at the number of its state");

const char* nameOf(MbStateId id) {
    return TABLE[static_cast<std::size_t>(id)].name;
}

std::string textOf(std::size_t event) {
    std::string text = getMbEventText(static_cast<MbEvent>(event));
    text.resize(text.size() - 2);  // without the brackets
    return text;
}

/// The events that lead from a state to another, on one arrow.
std::string getLabel(const MbStateRow& row, MbStateId next) {
    std::string label;
    for (std::size_t i = 0; i < NB_MB_EVENTS; ++i) {
        const MbCell& cell = row.cells[i];
        if (cell.next != next) continue;
        if (!label.empty()) label += "\\n";
        label += cell.reaction == MbReaction::COUNT_DOWN ? "last " + textOf(i) : textOf(i);
    }
    return label;
}

void writeArrows(std::ostream& stream, const MbStateRow& row) {
    if (row.next != NONE) {
        stream << "    " << row.name << " -> " << nameOf(row.next) << " [style=dashed];\n";
    }
    for (std::size_t i = 0; i < NB_MB_STATES; ++i) {
        const std::string label = getLabel(row, static_cast<MbStateId>(i));
        if (label.empty()) continue;
        stream << "    " << row.name << " -> " << TABLE[i].name << " [label=\"" << label
               << "\"];\n";
    }
}

}  // namespace

const MbStateRow& MbTransitionTable::getRow(MbStateId id) noexcept {
    return TABLE[static_cast<std::size_t>(id)];
}

void MbTransitionTable::writeDot(std::ostream& stream) {
    stream << "digraph bufferLife {\n"
              "    rankdir=LR;\n"
              "    node [fontname=\"Helvetica\", fontsize=11];\n"
              "    edge [fontname=\"Helvetica\", fontsize=9];\n";
    for (const MbStateRow& row : TABLE) {
        // Rounded: a thread is at it, and leads on by itself along the dashed arrow.
        stream << "    " << row.name
               << (row.next == NONE ? " [shape=box, style=filled, fillcolor=\"#dfe8f5\"];\n"
                                    : " [shape=box, style=rounded];\n");
    }
    for (const MbStateRow& row : TABLE) writeArrows(stream, row);
    stream << "}\n";
}

}  // namespace Orv
