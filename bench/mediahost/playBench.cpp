// The media host beside ffmpeg: whole programs, from their start to their end, with as many threads.

#include <benchmark/benchmark.h>
#include <chrono>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <spawn.h>
#include <sstream>
#include <string>
#include <sys/resource.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>
#include <vector>

namespace {

using Clock = std::chrono::steady_clock;

struct Run {
    double seconds;
    double processorSeconds;
    double peakMegabytes;
};

// Runs a program whose output nobody wants.
Run run(std::vector<std::string> arguments) {
    std::vector<char*> pointers;
    for (std::string& argument : arguments) pointers.push_back(argument.data());
    pointers.push_back(nullptr);
    posix_spawn_file_actions_t actions;
    posix_spawn_file_actions_init(&actions);
    for (const int output : {1, 2}) {
        posix_spawn_file_actions_addopen(&actions, output, "/dev/null", O_WRONLY, 0);
    }
    const auto begin = Clock::now();
    pid_t process = 0;
    int status = 1;
    rusage usage{};
    if (posix_spawnp(&process, pointers[0], &actions, nullptr, pointers.data(), environ) == 0) {
        wait4(process, &status, 0, &usage);
    }
    posix_spawn_file_actions_destroy(&actions);
    // Other codes tell of damaged pieces, of which one of the clips has many.
    if (!WIFEXITED(status) || WEXITSTATUS(status) == 1 || WEXITSTATUS(status) == 127) std::abort();
    const auto toSeconds = [](const timeval& time) {
        return static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_usec) * 1e-6;
    };
    return {std::chrono::duration<double>(Clock::now() - begin).count(),
            toSeconds(usage.ru_utime) + toSeconds(usage.ru_stime),
            static_cast<double>(usage.ru_maxrss) / 1024};
}

void measure(benchmark::State& state, const std::vector<std::string>& command) {
    double peak = 0;
    for (auto _ : state) {
        const Run result = run(command);
        state.SetIterationTime(result.seconds);
        peak = std::max(peak, result.peakMegabytes);
    }
    state.counters["peakMB"] = peak;
}

constexpr double BUDGET_MEGABYTES = 64;

void registerClip(const std::filesystem::path& clip) {
    const std::string name = "play " + clip.filename().string();
    const std::string threads = std::to_string(std::thread::hardware_concurrency());
    const auto add = [&](const char* library, const std::vector<std::string>& command) {
        benchmark::RegisterBenchmark(
            (name + '/' + library).c_str(),
            [command](benchmark::State& state) { measure(state, command); })
            ->UseManualTime()
            ->Iterations(1)
            ->Unit(benchmark::kMillisecond);
    };
    add("orv-mediahost",
        {ORV_MEDIAHOST, "play", clip.string(), "--threads", threads, "--cache", "64M"});
    add("ffmpeg", {"ffmpeg", "-nostdin", "-v", "error", "-threads", threads, "-i", clip.string(),
                   "-f", "null", "-"});
    benchmark::RegisterBenchmark((name + "/limit").c_str(),
                                 [](benchmark::State& state) {
                                     for (auto _ : state) state.SetIterationTime(1e-3);
                                     state.counters["peakMB"] = BUDGET_MEGABYTES + 96;
                                 })
        ->UseManualTime()
        ->Iterations(1);
}

double readAttribute(const std::string& text, const std::string& name) {
    const std::size_t at = text.find(' ' + name + "=\"");
    return at == std::string::npos ? -1 : std::strtod(text.c_str() + at + name.size() + 3, nullptr);
}

// A minute of simulated 1080p60 with sound, in real time; the counters are what it took.
void playPaced(benchmark::State& state) {
    const std::filesystem::path folder =
        std::filesystem::temp_directory_path() / "orv-mediahost-bench";
    for (auto _ : state) {
        const Run result = run({ORV_MEDIAHOST, "play", "simulated:1920x1080@60,60", "--rate",
                                "realtime", "--out", folder.string()});
        state.SetIterationTime(result.seconds);
        std::ostringstream report;
        report << std::ifstream(folder / "report.xml").rdbuf();
        state.counters["dropped+1"] = readAttribute(report.str(), "dropped") + 1;
        state.counters["p99us"] = readAttribute(report.str(), "p99Seconds") * 1e6;
        state.counters["core%"] = result.processorSeconds / result.seconds * 100;
        state.counters["firstMs"] = readAttribute(report.str(), "firstPictureSeconds") * 1e3;
    }
    std::filesystem::remove_all(folder);
}

void showLimits(benchmark::State& state) {
    for (auto _ : state) state.SetIterationTime(1e-3);
    state.counters["dropped+1"] = 1;
    state.counters["p99us"] = 2000;
    state.counters["core%"] = 30;
    state.counters["firstMs"] = 150;
}

const bool isRegistered = [] {
    const char* clips = std::getenv("ORV_CLIPS");
    const std::filesystem::path folder = clips != nullptr ? clips : "build/clips";
    std::vector<std::filesystem::path> files;
    if (std::filesystem::is_directory(folder)) {
        for (const auto& entry : std::filesystem::directory_iterator(folder)) {
            if (entry.is_regular_file()) files.push_back(entry.path());
        }
    }
    for (const auto& file : files) registerClip(file);
    // Twice, since what is reported are medians.
    const auto addPaced = [](const char* name, void (*function)(benchmark::State&)) {
        benchmark::RegisterBenchmark(name, function)
            ->UseManualTime()
            ->Iterations(1)
            ->Repetitions(2);
    };
    addPaced("paced 1080p60 60 s/orv-mediahost", playPaced);
    addPaced("paced 1080p60 60 s/limit", showLimits);
    return true;
}();

}  // namespace
