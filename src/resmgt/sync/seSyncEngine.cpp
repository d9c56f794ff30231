#include "seSyncEngine.h"

#include <algorithm>
#include <exception>
#include <ostream>
#include <stdexcept>

#include "assertions.h"
#include "mtThreadFactory.h"
#include "seBorrowedProtocolPrivate.h"
#include "seClientAwaitingPrivate.h"
#include "seGeneratorThreadPrivate.h"

namespace Orv {

SeSyncEngine& SeSyncEngine::getInstance() {
    static auto* const engine = new SeSyncEngine;
    return *engine;
}

SeSyncEngine::SeSyncEngine() = default;

SeSyncEngine::~SeSyncEngine() {
    try {
        const Generators generators = copyGenerators(nullptr);
        if (generators.empty()) return;
        for (const GeneratorPtr& generator : generators) generator->requestStop();
        stopAll(generators);
    } catch (...) {
        Assertions::traceCurrentException("destroying a sync engine");
    }
}

// Clients

void SeSyncEngine::addClient(const LiString& name, ObjPtr<SeClientThread>& client,
                             SeSourceProtocol& source, int divider) {
    ORV_ASSERT(!client.isNull());
    ORV_ASSERT(divider > 0);
    checkNew(*client);
    // Made, and where it fails destroyed, without the lock: the client hears of both.
    ObjPtr<MtThread> thread = MtThreadFactory::getInstance().create(
        name, ObjPtr<MtThreadProtocol>(new SeBorrowedProtocol(*client)));
    const LkGuard guard(_lock);
    findOrAddNoLock(source)->attach(client, thread, divider);
}

void SeSyncEngine::checkNew(const SeClientThread& client) const {
    const LkGuard guard(_lock);
    for (const GeneratorPtr& generator : _generators) generator->checkNew(client);
}

ObjPtrRet<SeClientThread> SeSyncEngine::removeClient(SeClientThread* client) {
    LkGuard guard(_lock);
    GeneratorPtr owner;
    bool foundOverall = false;
    for (const GeneratorPtr& generator : _generators) {
        const bool foundThisSyncGen = generator->has(client);
        ORV_ASSERT_TEXT(!(foundOverall && foundThisSyncGen),
                        "!( foundOverall == true && foundThisSyncGen == true )");
        if (!foundThisSyncGen) continue;
        foundOverall = true;
        owner = generator;
    }
    ORV_ASSERT(foundOverall);
    const SeClientAwaiting awaiting(*client);
    SeGeneratorThread::Client& claimed = owner->claim(*client);
    guard.unlock();
    return owner->remove(claimed);
}

// Generators

SeSyncEngine::GeneratorPtr SeSyncEngine::findOrAdd(SeSourceProtocol& source) {
    const LkGuard guard(_lock);
    return findOrAddNoLock(source);
}

SeSyncEngine::GeneratorPtr SeSyncEngine::findOrAddNoLock(SeSourceProtocol& source) {
    for (const GeneratorPtr& generator : _generators) {
        if (&generator->getSource() == &source) return generator;
    }
    return addSyncGenNoLock(source);
}

SeSyncEngine::GeneratorPtr SeSyncEngine::addSyncGenNoLock(SeSourceProtocol& source) {
    if (_generators.size() == _generators.max_size()) throw std::length_error("list too long");
    const auto generator = std::make_shared<SeGeneratorThread>(source);
    _generators.push_back(generator);
    try {
        generator->start();
    } catch (...) {
        _generators.pop_back();
        throw;
    }
    return generator;
}

bool SeSyncEngine::isSyncGenBeating(SeSourceProtocol& source) {
    return findOrAdd(source)->isBeating();
}

void SeSyncEngine::waitSyncGenBeating(SeSourceProtocol& source) {
    findOrAdd(source)->waitBeating(LkTimeLimit());
}

bool SeSyncEngine::waitSyncGenBeating(SeSourceProtocol& source, double seconds) {
    return findOrAdd(source)->waitBeating(LkTimeLimit(seconds));
}

bool SeSyncEngine::waitTickDone(SeSourceProtocol& source, std::uint32_t tick, double seconds) {
    return findOrAdd(source)->waitTickDone(tick, LkTimeLimit(seconds));
}

// End

void SeSyncEngine::stop() {
    stopAll(copyGenerators(nullptr));
}

void SeSyncEngine::stop(SeSourceProtocol& source) {
    stopAll(copyGenerators(&source));
}

/// @param source  whose generator is meant; null for all.
SeSyncEngine::Generators SeSyncEngine::copyGenerators(const SeSourceProtocol* source) const {
    const LkGuard guard(_lock);
    Generators generators;
    for (const GeneratorPtr& generator : _generators) {
        if (source == nullptr || &generator->getSource() == source) {
            generators.push_back(generator);
        }
    }
    return generators;
}

/// They stay in the list until they are stopped, so that no source gets a second one meanwhile.
void SeSyncEngine::stopAll(const Generators& generators) {
    const bool isEngineThread = SeBorrowedProtocol::findCurrent() != nullptr;
    ORV_ASSERT(!isEngineThread);
    for (const GeneratorPtr& generator : generators) generator->announceStop();
    std::exception_ptr first;
    for (const GeneratorPtr& generator : generators) {
        const std::exception_ptr thrown = generator->stop();
        if (!first) first = thrown;
        const LkGuard guard(_lock);
        _generators.remove(generator);
    }
    if (first) std::rethrow_exception(first);
}

void SeSyncEngine::dump(std::ostream& stream) const {
    const LkGuard guard(_lock);
    stream << "generators:\n";
    for (const GeneratorPtr& generator : _generators) generator->dump(stream);
}

}  // namespace Orv
