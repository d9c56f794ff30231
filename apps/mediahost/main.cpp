// orv-mediahost: plays, records and inspects media on the library's devices.

#include <CLI/CLI.hpp>
#include <functional>
#include <iostream>
#include <memory>
#include <orv/lgChromeSink.h>
#include <orv/lgRegistry.h>

#include "host.h"
#include "mediaError.h"
#include "process.h"
#include "report.h"

namespace MediaHost {

namespace {

enum ExitCode { PLAYED = 0, FAILED = 1, PLAYED_WITH_FAULTS = 2, INTERRUPTED = 130 };

struct Options {
    std::string input;
    std::vector<std::string> names;  // of devices or properties, or assignments
    std::string folder, film, rate, loops = "1", cache = "64M", patience = "10", strategy = "lru",
                                    timecode = "pal", trace;
    std::vector<std::string> sets, watches;
    std::int64_t nbThreads = 0;
    bool isReverse = false, hasFrames = false, hasChecksums = false, hasWindow = false,
         hasSound = false;
};

/// "simulated", or "simulated:1920x1080@60,8": width, height, rate, seconds.
void addSimulated(Pipeline& pipeline, const std::string& input) {
    Settings pattern;
    Settings tone;
    if (const std::size_t colon = input.find(':'); colon != std::string::npos) {
        const std::string text = input.substr(colon + 1);
        const std::size_t cross = text.find('x');
        const std::size_t at = text.find('@');
        const std::size_t comma = text.find(',');
        if (cross == std::string::npos || at == std::string::npos || comma == std::string::npos ||
            !(cross < at && at < comma)) {
            throw MediaError("expected simulated:WIDTHxHEIGHT@RATE,SECONDS, got \"" + input + '"');
        }
        pattern.set("width", text.substr(0, cross));
        pattern.set("height", text.substr(cross + 1, at - cross - 1));
        pattern.set("rate", text.substr(at + 1, comma - at - 1));
        pattern.set("seconds", text.substr(comma + 1));
        tone.set("seconds", text.substr(comma + 1));
    }
    pipeline.addDevice("pattern", "pattern", pattern);
    pipeline.addDevice("tone", "tone", tone);
}

void addSources(Pipeline& pipeline, const Options& options) {
    if (options.input == "simulated" || options.input.rfind("simulated:", 0) == 0) {
        addSimulated(pipeline, options.input);
        return;
    }
    Settings settings;
    settings.set("file", options.input);
    settings.set("threads", std::to_string(options.nbThreads));
    pipeline.addDevice("reader", "reader", settings);
}

void takeOptions(Pipeline& pipeline, const Options& options) {
    const auto asked = [](const char* option, const auto& set, const std::string& value) {
        try {
            set(value);
        } catch (const MediaError&) {
            throwBecause(std::string(option) + ' ' + value);
        }
    };
    asked("--cache", [&](const std::string& text) { pipeline.setCache(text); }, options.cache);
    asked(
        "--strategy", [&](const std::string& text) { pipeline.setStrategy(text); },
        options.strategy);
    asked(
        "--timecode", [&](const std::string& text) { pipeline.setTimecode(text); },
        options.timecode);
    asked(
        "--rate", [&](const std::string& text) { pipeline.setRate(text); },
        options.rate.empty() ? std::string(options.hasSound ? "realtime" : "fast") : options.rate);
    asked("--loops", [&](const std::string& text) { pipeline.setLoops(text); }, options.loops);
    asked(
        "--patience", [&](const std::string& text) { pipeline.setPatience(text); },
        options.patience);
    pipeline.isReverse = options.isReverse;
    pipeline.folder = options.folder;
    pipeline.trace = options.trace;
    for (const std::string& set : options.sets) pipeline.sets.push_back({set, "--set " + set});
    for (const std::string& name : options.watches)
        pipeline.watches.push_back({name, "--watch " + name});
}

/// The pipeline of play: source, mixer, scope, display, recorder and clock.
Pipeline makePipeline(const Options& options) {
    Pipeline pipeline;
    takeOptions(pipeline, options);
    addSources(pipeline, options);
    pipeline.addDevice("mixer", "mixer");
    pipeline.addDevice("scope", "scope");
    if (options.hasSound) pipeline.addDevice("speaker", "speaker");
    Settings display;
    display.set("window", options.hasWindow ? "1" : "0");
    pipeline.addDevice("display", "display", display);
    Settings recorder;
    recorder.set("frames", options.hasFrames ? "1" : "0");
    recorder.set("checksums", options.hasChecksums ? "1" : "0");
    if (!options.film.empty()) recorder.set("encode", options.film);
    pipeline.addDevice("recorder", "recorder", recorder);
    pipeline.addDevice("clock", "clock");
    return pipeline;
}

/// What is logged for a timeline viewer, for as long as this lives.
class Trace {
public:
    explicit Trace(const std::filesystem::path& path) {
        if (path.empty()) return;
        try {
            _sink = std::make_shared<Orv::LgChromeSink>(path);
        } catch (...) {
            throwBecause("cannot write the trace \"" + path.string() + '"');
        }
        Orv::LgRegistry::getInstance().addSink(_sink);
    }
    ~Trace() {
        if (_sink) Orv::LgRegistry::getInstance().removeSink(*_sink);
    }
    Trace(const Trace&) = delete;
    Trace& operator=(const Trace&) = delete;

private:
    std::shared_ptr<Orv::LgChromeSink> _sink;
};

int play(Pipeline pipeline) {
    const Trace trace(pipeline.trace);
    auto host = std::make_unique<Host>(std::move(pipeline));
    host->open();
    host->connect();
    bool isWhole = false;
    try {
        isWhole = host->play();
    } catch (const DevicesHang&) {
        (void)host.release();  // what hangs uses it until the program has ended
        throw;
    }
    const Report report(*host, isWhole);
    report.print(std::cout);
    const std::filesystem::path& folder = host->getPipeline().folder;
    if (!folder.empty()) report.write(folder / "report.xml");
    if (!isWhole) return INTERRUPTED;
    return report.getFaults().empty() ? PLAYED : PLAYED_WITH_FAULTS;
}

int list() {
    for (const DeviceKind& kind : listKinds()) {
        std::cout << "  " << std::left << std::setw(10) << kind.name << kind.description << '\n';
    }
    return PLAYED;
}

/// The devices without a show: one of each kind, the reader with the file if there is one.
Pipeline makeBench(const Options& options) {
    Pipeline pipeline;
    takeOptions(pipeline, options);
    Settings reader;
    if (!options.input.empty()) reader.set("file", options.input);
    for (const DeviceKind& kind : listKinds()) {
        pipeline.addDevice(kind.name, kind.name,
                           kind.name == std::string("reader") ? reader : Settings());
    }
    return pipeline;
}

int describe(const Options& options) {
    Host host(makeBench(options));
    host.open();
    for (const std::string& name : options.names) describeDevice(host, name, std::cout);
    return PLAYED;
}

int get(const Options& options) {
    Host host(makeBench(options));
    host.open();
    for (const std::string& name : options.names) std::cout << host.getProperty(name) << '\n';
    return PLAYED;
}

int set(const Options& options) {
    Host host(makeBench(options));
    host.open();
    for (const std::string& assignment : options.names) {
        const std::size_t equals = assignment.find('=');
        if (equals == std::string::npos) {
            throw MediaError("expected DEVICE:PROPERTY=VALUE, got \"" + assignment + '"');
        }
        const std::string name = assignment.substr(0, equals);
        host.setProperty(name, assignment.substr(equals + 1));
        std::cout << name << " = " << host.getProperty(name) << '\n';
    }
    return PLAYED;
}

int watch(Options options) {
    options.watches = options.names;
    return play(makePipeline(options));
}

bool isPipelineFile(const std::string& path) {
    return path.ends_with(".pipeline") || path.ends_with(".txt");
}

int graph(const Options& options) {
    Host host(isPipelineFile(options.input) ? Pipeline::read(options.input)
                                            : makePipeline(options));
    host.open();
    host.connect();
    writeGraph(host, std::cout);
    return PLAYED;
}

void addShowOptions(CLI::App& command, Options& options) {
    command.add_option("--rate", options.rate, "realtime, fast (else), or a multiple of real time");
    command.add_flag("--reverse", options.isReverse, "play backwards");
    command.add_option("--loops", options.loops, "how often to play; 0: for ever");
    command.add_option("--cache", options.cache, "memory for pictures: 64M, 1G, 10frames");
    command.add_option("--strategy", options.strategy,
                       "what gives way in the cache: lru or random");
    command.add_option("--timecode", options.timecode, "film24, pal, ntsc-nd or ntsc-df");
    command.add_option("--set", options.sets, "DEVICE:PROPERTY=VALUE before the start")->take_all();
    command.add_option("--threads", options.nbThreads,
                       "that decode pictures; 0: one per processor");
    command.add_option("--patience", options.patience,
                       "seconds that devices may take to stop before they are given up");
    command.add_option("--trace", options.trace,
                       "writes a timeline for chrome://tracing or Perfetto");
    command.add_flag("--window", options.hasWindow, "shows the pictures in a window");
    command.add_flag("--sound", options.hasSound, "lets the sound be heard, in real time");
}

constexpr const char* INPUT_HELP = "a media file, or simulated[:WIDTHxHEIGHT@RATE,SECONDS]";

/// A command that is carried out with the options when the command line is read.
CLI::App& addCommand(CLI::App& app, const char* name, const char* description,
                     std::function<void()> carryOut) {
    CLI::App* command = app.add_subcommand(name, description);
    command->callback(std::move(carryOut));
    return *command;
}

void addShowCommands(CLI::App& app, Options& options, int& code) {
    CLI::App& playing = addCommand(app, "play", "plays a file, or what is simulated",
                                   [&] { code = play(makePipeline(options)); });
    playing.add_option("input", options.input, INPUT_HELP)->required();
    playing.add_option("--out", options.folder, "a folder for sound, contact sheet and report");
    playing.add_flag("--frames", options.hasFrames, "writes each picture as PNG, too");
    playing.add_option("--encode", options.film, "writes the pictures as a film of that name");
    playing.add_flag("--checksums", options.hasChecksums, "writes the checksum of each picture");
    playing.add_option("--watch", options.watches, "DEVICE:PROPERTY, printed when it changes")
        ->take_all();
    addShowOptions(playing, options);

    CLI::App& watching = addCommand(app, "watch", "plays, and prints properties when they change",
                                    [&] { code = watch(options); });
    watching.add_option("input", options.input, INPUT_HELP)->required();
    watching.add_option("property", options.names, "DEVICE:PROPERTY")->required();
    addShowOptions(watching, options);

    addCommand(app, "run", "plays what a text file describes",
               [&] { code = play(Pipeline::read(options.input)); })
        .add_option("file", options.input, "see docs/mediahost.md")
        ->required();
}

void addDeviceCommands(CLI::App& app, Options& options, int& code) {
    addCommand(app, "list", "lists the kinds of devices", [&] { code = list(); });
    const auto add = [&](const char* name, const char* description, int (*carryOut)(const Options&),
                         const char* argument, const char* help) {
        CLI::App& command = addCommand(app, name, description,
                                       [&options, &code, carryOut] { code = carryOut(options); });
        command.add_option(argument, options.names, help)->required();
        command.add_option("--input", options.input, "a file for the reader");
    };
    add("describe", "tells what properties and streams devices have", describe, "device",
        "as list names them");
    add("get", "prints properties", get, "property", "DEVICE:PROPERTY");
    add("set", "sets properties and prints what they are then", set, "assignment",
        "DEVICE:PROPERTY=VALUE");
    addCommand(app, "graph", "prints devices, streams and sequence for Graphviz",
               [&] { code = graph(options); })
        .add_option("input", options.input, "as for play, or a pipeline file (.pipeline)")
        ->required();
}

int runCommand(int nbArguments, char** arguments) {
    CLI::App app("Plays, records and inspects media.", "orv-mediahost");
    app.require_subcommand(1);
    Options options;
    int code = PLAYED;
    addShowCommands(app, options, code);
    addDeviceCommands(app, options, code);
    try {
        app.parse(nbArguments, arguments);
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? PLAYED : FAILED;
    }
    return code;
}

/// "play clip.mp4", for the first line of an error.
std::string whatWasAsked(int nbArguments, char** arguments) {
    std::string text;
    for (int i = 1; i < nbArguments; ++i) text += std::string(i > 1 ? " " : "") + arguments[i];
    return text;
}

}  // namespace

}  // namespace MediaHost

int main(int nbArguments, char** arguments) {
    MediaHost::Process::catchInterrupts();
    try {
        return MediaHost::runCommand(nbArguments, arguments);
    } catch (const std::exception& error) {
        std::cerr << "orv-mediahost: " << MediaHost::whatWasAsked(nbArguments, arguments)
                  << "\n  because: " << MediaHost::describeChain(error) << std::endl;
        return MediaHost::FAILED;
    }
}
