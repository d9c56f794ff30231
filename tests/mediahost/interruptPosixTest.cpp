// Ctrl-C, whenever it comes: the sequence stops in order, and what there is becomes whole.

#include <cstdlib>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <signal.h>
#include <sys/ioctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include "eventually.h"
#include "hostProgram.h"

namespace Orv {

namespace {

using testing::HasSubstr;

/// orv-mediahost as a process of its own.
class Host {
public:
    explicit Host(std::vector<std::string> arguments) : _log(_folder / "log") {
        // Who starts the tests may ignore Ctrl-C, as shells do for what runs behind; one that comes
        // before the child takes it again waits.
        sigset_t interrupts, before;
        sigemptyset(&interrupts);
        sigaddset(&interrupts, SIGINT);
        sigprocmask(SIG_BLOCK, &interrupts, &before);
        _process = fork();
        if (_process != 0) {
            sigprocmask(SIG_SETMASK, &before, nullptr);
            return;
        }
        signal(SIGINT, SIG_DFL);
        sigprocmask(SIG_UNBLOCK, &interrupts, nullptr);
        const int log = open(_log.c_str(), O_WRONLY | O_CREAT, 0600);
        dup2(log, 1);
        dup2(log, 2);
        arguments.insert(arguments.begin(), "./orv-mediahost");
        std::vector<char*> pointers;
        for (std::string& argument : arguments) pointers.push_back(argument.data());
        pointers.push_back(nullptr);
        execv(pointers[0], pointers.data());
        _exit(127);
    }
    ~Host() {
        if (_process > 0) {
            kill(_process, SIGKILL);
            waitpid(_process, nullptr, 0);
        }
    }
    Host(const Host&) = delete;
    Host& operator=(const Host&) = delete;

    void interrupt() const { kill(_process, SIGINT); }
    std::string getOutput() const { return readFile(_log); }
    bool hasWritten(const char* text) const { return getOutput().find(text) != std::string::npos; }

    /// The exit code; -1 if a signal ended it.
    int join() {
        int status = 0;
        waitpid(std::exchange(_process, 0), &status, 0);
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

private:
    const TestFolder _folder;
    const std::string _log;
    pid_t _process;
};

TEST(MediaHostInterrupt, finishesTheFilesOfAShowThatIsOn) {
    const TestFolder out;
    Host host({"play", "simulated:320x180@25,3600", "--rate", "realtime", "--checksums", "--out",
               out.getPath()});
    // The recorder is the last to get what comes.
    ASSERT_TRUE(eventually("pictures and sound have come", [&] {
        return std::filesystem::exists(out / "frames.txt.part") &&
               std::filesystem::exists(out / "sound.wav.part");
    })) << host.getOutput();
    host.interrupt();
    EXPECT_EQ(host.join(), 130) << host.getOutput();
    EXPECT_THAT(host.getOutput(), HasSubstr("interrupted after"));
    EXPECT_EQ(out.list(), (std::vector<std::string>{"contact-sheet.png", "frames.txt", "report.xml",
                                                    "sound.wav", "waveform.png"}));
    EXPECT_THAT(readFile(out / "report.xml"), HasSubstr("whole=\"false\""));
    const Wave wave = readWave(out / "sound.wav");
    EXPECT_GT(wave.samples.size(), 0u);
    EXPECT_LT(wave.samples.size(), 3600u * 48000 * 2);
}

TEST(MediaHostInterrupt, endsInOrderAtAnyMomentOfTheStart) {
    // Wherever in its start it then is; on some machines still before it, on others behind it.
    for (int i = 0; i < 12; ++i) {
        const TestFolder out;
        Host host(
            {"play", "simulated:320x180@25,3600", "--rate", "realtime", "--out", out.getPath()});
        // Before the handler is there the signal ends the program, as it does any other.
        for (int wait = 0; wait < i; ++wait) usleep(2000);
        host.interrupt();
        const int code = host.join();
        EXPECT_TRUE(code == 130 || code == -1) << code << host.getOutput();
        for (const std::string& name : out.list()) {
            EXPECT_EQ(name.find(".part"), std::string::npos) << name;
            if (name == "sound.wav") readWave(out / name);
        }
    }
}

// A file that is a pipe stands for a disk that does not answer: opening it waits for a reader.
TEST(MediaHostInterrupt, waitsForTheFilesOfAShowThatIsOver) {
    const TestFolder out;
    const std::string pipe = out / "waveform.png.part";
    ASSERT_EQ(mkfifo(pipe.c_str(), 0600), 0);
    Host host({"play", "simulated:64x48@25,1", "--out", out.getPath()});
    // The scope tells the recorder of the end before it draws.
    ASSERT_TRUE(eventually("the sound is whole", [&] {
        return std::filesystem::exists(out / "sound.wav");
    })) << host.getOutput();
    host.interrupt();
    ASSERT_TRUE(eventually("it stops", [&] { return host.hasWritten("interrupted: "); }))
        << host.getOutput();
    EXPECT_EQ(readFile(pipe).substr(1, 3), "PNG");
    EXPECT_EQ(host.join(), 130) << host.getOutput();
    EXPECT_EQ(readWave(out / "sound.wav").samples.size(), 2u * 48000);
    EXPECT_THAT(readFile(out / "report.xml"), HasSubstr("whole=\"false\""));
}

/// A pipe in the place of a file: it takes a page, then the writer waits for ever.
class StuckPipe {
public:
    explicit StuckPipe(const std::string& path) {
        EXPECT_EQ(mkfifo(path.c_str(), 0600), 0);
        _descriptor = open(path.c_str(), O_RDONLY | O_NONBLOCK | O_CLOEXEC);
        _nbBytes = fcntl(_descriptor, F_SETPIPE_SZ, 1);  // one page
        EXPECT_GT(_nbBytes, 0);
    }
    ~StuckPipe() { close(_descriptor); }
    StuckPipe(const StuckPipe&) = delete;
    StuckPipe& operator=(const StuckPipe&) = delete;

    bool isFull() const {
        int nbBytes = 0;
        return ioctl(_descriptor, FIONREAD, &nbBytes) == 0 && nbBytes >= _nbBytes;
    }

private:
    int _descriptor;
    int _nbBytes;
};

/// Plays until the recorder is stuck, in the middle of a block of sound, and has heard of Ctrl-C.
void interruptWithRecorderStuck(Host& host, const StuckPipe& pipe) {
    ASSERT_TRUE(eventually("the recorder is stuck", [&] { return pipe.isFull(); }))
        << host.getOutput();
    host.interrupt();
    ASSERT_TRUE(eventually("it stops", [&] { return host.hasWritten("interrupted: "); }))
        << host.getOutput();
}

/// Programs that are started meanwhile may leave threads behind, for the thread sanitizer.
class LeavingThreads {
public:
    LeavingThreads() {
        const std::string options = _before.empty() ? "" : _before + ':';
        setenv(VARIABLE, (options + "report_thread_leaks=0").c_str(), 1);
    }
    ~LeavingThreads() { setenv(VARIABLE, _before.c_str(), 1); }
    LeavingThreads(const LeavingThreads&) = delete;
    LeavingThreads& operator=(const LeavingThreads&) = delete;

private:
    static constexpr const char* VARIABLE = "TSAN_OPTIONS";
    const std::string _before = std::getenv(VARIABLE) != nullptr ? std::getenv(VARIABLE) : "";
};

TEST(MediaHostInterrupt, givesUpADeviceThatDoesNotStop) {
    const LeavingThreads leaving;  // what hangs, and all that it uses, is left on purpose
    const TestFolder out;
    const StuckPipe pipe(out / "sound.wav.part");
    Host host({"play", "simulated:64x48@25,3600", "--rate", "realtime", "--patience", "0.3",
               "--out", out.getPath()});
    interruptWithRecorderStuck(host, pipe);
    EXPECT_EQ(host.join(), 1) << host.getOutput();
    EXPECT_THAT(host.getOutput(), HasSubstr("the devices do not stop and were given up"));
    EXPECT_THAT(host.getOutput(), HasSubstr("recorder is in \""));
}

TEST(MediaHostInterrupt, endsAtOnceWhenAskedTwice) {
    const TestFolder out;
    const StuckPipe pipe(out / "sound.wav.part");
    Host host({"play", "simulated:64x48@25,3600", "--rate", "realtime", "--patience", "1e6",
               "--out", out.getPath()});
    interruptWithRecorderStuck(host, pipe);
    host.interrupt();
    EXPECT_EQ(host.join(), 130) << host.getOutput();
}

}  // namespace

}  // namespace Orv
