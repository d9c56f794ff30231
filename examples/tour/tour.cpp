// A tour of what there is, in the order in which an application meets it.
#include <cstdio>
#include <orv/base.h>
#include <orv/resmgt.h>
#include <thread>
#include <vector>

using namespace Orv;

namespace {

class Player {};

/// The application's own package. It depends on the whole library, so it comes up last.
class PlayerPackage : public InPackageInit {
public:
    PlayerPackage() : InPackageInit("player", InInit<Player>::getType()) {
        registerPackage();
        addDependency(InInit<OrvInit::resmgt>::getType());
    }

protected:
    void performInitialize() override { std::printf("the player comes up\n"); }
    void performShutdown() override { std::printf("the player goes down\n"); }
};

const PlayerPackage playerPackage;

/// Something that several threads use and that goes with its last user.
class Clip : public RCBase<LkCounter<long>> {
public:
    ~Clip() override { std::printf("the clip is closed by its last user\n"); }
    int nbFrames = 250;
};

void startUp() {
    std::printf("-- packages come up after what they need\n");
    InPackageInit::initializeAll();
    for (const std::string& name : InPackageInit::getInitializedNames()) {
        std::printf("%s ", name.c_str());
    }
    std::printf("\n");
}

void share() {
    std::printf("\n-- counted pointers share an object among threads\n");
    const RCShdPtr<Clip> clip(new Clip);
    std::vector<std::jthread> users;
    for (int i = 0; i < 3; ++i) {
        users.emplace_back([clip] { std::printf("a user sees %d frames\n", clip->nbFrames); });
    }
    users.clear();
}

void fail() {
    std::printf("\n-- an exception tells why and where, and is caught by any of its classes\n");
    try {
        const RCShdPtr<Clip> none;
        std::printf("%d\n", none->nbFrames);
    } catch (const ExBase& exception) {
        std::printf("%s\n", exception.what());
    }
    try {
        Assertions::throwSysAssertionFailed("player/output", 12, "open(device)", 2);
    } catch (const std::logic_error& exception) {
        std::printf("%s\n", exception.what());
    }
}

}  // namespace

int main() {
    startUp();
    share();
    fail();
    std::printf("\n-- and down again, the last to come up first\n");
    InPackageInit::shutdownAll();
    std::printf("the library is down again\n");
    return 0;
}
