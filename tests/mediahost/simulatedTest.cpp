// What works everywhere, with simulated sources.

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <gtest/gtest.h>
#include <set>

#include "hostProgram.h"

namespace Orv {

namespace {

using testing::HasSubstr;

/// Timecodes by counting one by one, as a clock with wheels would.
class Wheels {
public:
    Wheels(int perSecond, bool isDropping) : _perSecond(perSecond), _isDropping(isDropping) {}

    std::string getText() const {
        char text[32];
        std::snprintf(text, sizeof text,
                      _isDropping ? "%02d;%02d;%02d;%02d" : "%02d:%02d:%02d:%02d", _hours, _minutes,
                      _seconds, _frames);
        return text;
    }
    void step() {
        if (++_frames < _perSecond) return;
        _frames = 0;
        if (++_seconds < 60) return;
        _seconds = 0;
        if (++_minutes == 60) {
            _minutes = 0;
            _hours = (_hours + 1) % 24;
        }
        if (_isDropping && _minutes % 10 != 0) _frames = 2;
    }

private:
    const int _perSecond;
    const bool _isDropping;
    int _hours = 0, _minutes = 0, _seconds = 0, _frames = 0;
};

std::vector<std::string> findFaults(const std::string& output) {
    return output.find("fault ") == std::string::npos ? std::vector<std::string>()
                                                      : std::vector<std::string>{output};
}

TEST(MediaHost, burnsInAndReportsTheTimecodesOfEveryStandard) {
    struct Row {
        const char* name;
        const char* rate;
        int perSecond;
        bool isDropping;
        int nbSeconds;
    };
    for (const Row& row : {Row{"film24", "24", 24, false, 130}, Row{"pal", "25", 25, false, 130},
                           Row{"ntsc-nd", "30000/1001", 30, false, 130},
                           // Beyond the tenth minute, which drops nothing.
                           Row{"ntsc-df", "30000/1001", 30, true, 610}}) {
        SCOPED_TRACE(row.name);
        const TestFolder folder;
        const std::string path = folder / "bars.pipeline";
        writeFile(path, "timecode " + std::string(row.name) +
                            "\ndevice bars pattern width=96 height=64 rate=" + row.rate +
                            " seconds=" + std::to_string(row.nbSeconds) +
                            "\ndevice screen display\ndevice tape recorder checksums=1\n"
                            "device beat clock\nout \"" +
                            (folder / "out") + "\"\n");
        const HostRun run = runHost("run " + path);
        ASSERT_EQ(run.code, 0) << run.output;
        const std::vector<FrameLine> lines = readFrames(folder / "out/frames.txt");
        ASSERT_EQ(lines.size(),
                  static_cast<std::size_t>(std::llround(
                      row.nbSeconds * (row.perSecond == 30 ? 30000.0 / 1001 : row.perSecond))));
        Wheels wheels(row.perSecond, row.isDropping);
        std::set<std::string> pictures;
        for (const FrameLine& line : lines) {
            ASSERT_EQ(line.timecode, wheels.getText()) << line.index;
            pictures.insert(line.checksum);
            wheels.step();
        }
        // Each picture has its own timecode burnt in.
        EXPECT_EQ(pictures.size(), lines.size());
    }
}

TEST(MediaHost, playsBackwardsAndInLoopsWhatItPlaysForwards) {
    const TestFolder forwards, backwards, loops;
    const std::string input = "play simulated:320x180@25,4 --checksums ";
    ASSERT_EQ(runHost(input + "--out " + forwards.getPath()).code, 0);
    // Three pictures fit: each is made again and again.
    ASSERT_EQ(runHost(input + "--reverse --cache 3frames --out " + backwards.getPath()).code, 0);
    ASSERT_EQ(
        runHost(input + "--loops 3 --cache 12frames --strategy random --out " + loops.getPath())
            .code,
        0);
    const std::vector<FrameLine> there = readFrames(forwards / "frames.txt");
    const std::vector<FrameLine> back = readFrames(backwards / "frames.txt");
    const std::vector<FrameLine> around = readFrames(loops / "frames.txt");
    ASSERT_EQ(there.size(), 100u);
    ASSERT_EQ(back.size(), 100u);
    ASSERT_EQ(around.size(), 300u);
    for (std::size_t i = 0; i < there.size(); ++i) {
        EXPECT_EQ(there[i].number, static_cast<std::int64_t>(i));
        EXPECT_EQ(back[99 - i].number, there[i].number);
        EXPECT_EQ(back[99 - i].checksum, there[i].checksum);
        for (std::size_t loop = 0; loop < 3; ++loop) {
            EXPECT_EQ(around[loop * 100 + i].checksum, there[i].checksum);
        }
    }
    const Wave wave = readWave(forwards / "sound.wav");
    Wave reversed = readWave(backwards / "sound.wav");
    ASSERT_EQ(wave.samples.size(), 4u * 48000 * 2);
    std::reverse(reversed.samples.begin(), reversed.samples.end());
    EXPECT_EQ(wave.samples, reversed.samples);  // both sides are the same tone
    EXPECT_EQ(readWave(loops / "sound.wav").samples.size(), 3 * wave.samples.size());
}

TEST(MediaHost, writesAToneOfTheRightPitchAndLevel) {
    const TestFolder folder;
    ASSERT_EQ(
        runHost("play simulated:32x32@25,2 --set mixer:channel1:gain=-6 --out " + folder.getPath())
            .code,
        0);
    const Wave wave = readWave(folder / "sound.wav");
    ASSERT_EQ(wave.rate, 48000);
    ASSERT_EQ(wave.nbChannels, 2);
    int nbRises = 0;
    int highest = 0;
    for (std::size_t i = 2 * 480; i + 2 < std::size_t{2} * 48000; i += 2) {
        nbRises += wave.samples[i] < 0 && wave.samples[i + 2] >= 0;
        highest = std::max<int>(highest, wave.samples[i]);
    }
    EXPECT_NEAR(nbRises, 440 * 0.99, 2);
    EXPECT_NEAR(highest, 0.25 * 32768 * std::pow(10, -6.0 / 20), 4);
}

TEST(MediaHost, leavesAllThatWasAskedForAndNothingElse) {
    const TestFolder folder;
    const HostRun run = runHost("play simulated:64x48@10,1 --frames --checksums --out " +
                                folder.getPath() + " --trace " + (folder / "trace.json"));
    ASSERT_EQ(run.code, 0) << run.output;
    EXPECT_EQ(folder.list(),
              (std::vector<std::string>{"contact-sheet.png", "frames", "frames.txt", "report.xml",
                                        "sound.wav", "trace.json", "waveform.png"}));
    EXPECT_EQ(readFile(folder / "frames/000009.png").substr(1, 3), "PNG");
    EXPECT_FALSE(std::filesystem::exists(folder / "frames/000010.png"));
    const std::string report = readFile(folder / "report.xml");
    EXPECT_THAT(report, HasSubstr("whole=\"true\""));
    EXPECT_THAT(report, HasSubstr("pictures=\"10\""));
    EXPECT_THAT(report, HasSubstr("name=\"master:gain\""));
    EXPECT_THAT(readFile(folder / "trace.json"), HasSubstr("\"display\""));
}

double readAttribute(const std::string& xml, const std::string& name) {
    const std::size_t at = xml.find(' ' + name + "=\"");
    return at == std::string::npos ? -1 : std::strtod(xml.c_str() + at + name.size() + 3, nullptr);
}

TEST(MediaHost, keepsTheTimeOfAPacedShow) {
    const TestFolder folder;
    const HostRun run =
        runHost("play simulated:64x48@50,1 --rate 2 --checksums --out " + folder.getPath());
    const std::string report = readFile(folder / "report.xml");
    // A machine that is busy with other things may be late for a picture, but says so.
    const double nbDropped = readAttribute(report, "dropped");
    EXPECT_EQ(run.code, nbDropped > 0 ? 2 : 0) << run.output;
    EXPECT_EQ(readAttribute(report, "pictures") + nbDropped, 50) << run.output;
    EXPECT_EQ(readFrames(folder / "frames.txt").size(), readAttribute(report, "pictures"));
    EXPECT_EQ(readWave(folder / "sound.wav").samples.size(), 2u * 48000);
    // At twice the speed the last picture is due after 0.49 seconds, and not before.
    EXPECT_GE(readAttribute(report, "seconds"), 0.48);
}

TEST(MediaHost, tellsWhatIsWrongWithWhatItIsAskedFor) {
    struct Row {
        const char* arguments;
        const char* expected;
    };
    const Row rows[] = {
        {"play simulated --cache 1k", "the cache has only 1024; give it more with --cache"},
        {"play simulated --cache much", "--cache much\n  because: expected a size such as 64M"},
        {"play simulated --rate 0", "expected fast, realtime, or a multiple of real time"},
        {"play simulated --rate nan", "expected fast, realtime, or a multiple of real time"},
        {"play simulated --loops -1", "expected how often to play"},
        {"play simulated --strategy mru", "expected one of lru random, got \"mru\""},
        {"play simulated --timecode ebu",
         "expected one of film24 pal ntsc-nd ntsc-df, got \"ebu\""},
        {"play simulated:1x1@25,1", "the setting width=1 is no whole number from 16 to 8192"},
        {"play simulated:64x64@0,1", "the setting rate=0 is no rate such as 25 or 30000/1001"},
        {"play simulated:64", "expected simulated:WIDTHxHEIGHT@RATE,SECONDS"},
        {"play simulated --set mixer:channel1:gain=99",
         "Value 99 is out of range for property gain"},
        {"play simulated --set mixer:channel1:gain=loud",
         "\"loud\" is no value of the type double"},
        {"play simulated --set mixer:channel1:gain", "expected DEVICE:PROPERTY=VALUE"},
        {"play simulated --set organ:gain=1", "Device name not found in the registry."},
        {"play simulated --watch mixer:channel9:gain",
         "cannot watch the property \"mixer:channel9:gain\""},
        {"get mixer:gain:", "cannot get the property \"mixer:gain:\""},
        {"set display:shown=1", "\"set\" is not available for property shown"},
        {"set tone:position=5", "to \"5\"\n  because: there are no pictures to go to"},
        {"run missing.pipeline", "cannot open the pipeline \"missing.pipeline\""},
        {"dance", "subcommand is required"},
        {"play", "input is required"},
    };
    for (const Row& row : rows) {
        const HostRun run = runHost(row.arguments);
        EXPECT_EQ(run.code, 1) << row.arguments;
        EXPECT_THAT(run.output, HasSubstr(row.expected)) << row.arguments;
    }
}

TEST(MediaHost, showsAndSetsPropertiesOfItsDevices) {
    const HostRun list = runHost("list");
    for (const char* kind :
         {"reader", "mixer", "scope", "recorder", "display", "clock", "pattern", "tone"}) {
        EXPECT_THAT(list.output, HasSubstr(kind));
        EXPECT_EQ(runHost(std::string("describe ") + kind).code, 0) << kind;
    }
    EXPECT_THAT(runHost("describe mixer").output, HasSubstr("unit dB; -60 to 12"));
    EXPECT_EQ(runHost("get pattern:video:width mixer:master:mute").output.substr(0, 10),
              "1280\nfalse");
    EXPECT_THAT(runHost("set mixer:master:mute=on mixer:channel4:gain=-2.5").output,
                HasSubstr("mixer:channel4:gain = -2.5"));
    const HostRun watch = runHost("watch simulated:32x32@25,1 pattern:position mixer:master:peak");
    EXPECT_EQ(watch.code, 0);
    EXPECT_THAT(watch.output, HasSubstr("pattern:position = 24\n"));
    // The click at the begin may be over when the notice of it is read; the tone stays to the end,
    // when what has not been told yet is.
    EXPECT_THAT(watch.output, HasSubstr("mixer:master:peak = -12.04"));
    const HostRun graph = runHost("graph simulated");
    EXPECT_THAT(graph.output, HasSubstr("\"mixer\" -> \"scope\" [label=\"out\"]"));
    EXPECT_THAT(graph.output, HasSubstr("\"display\" -> \"tone\" [style=dashed"));
}

constexpr const char* TWO_TONES =
    "# two tones, one of them quieter\n"
    "device low tone hertz=100 seconds=0.5\n"
    "device high tone hertz=1000 seconds=1   # lasts longer\n"
    "device desk mixer\n"
    "device tape recorder\n"
    "device beat clock rate=100\n"
    "connect low:audio push desk:channel1\n"
    "connect high:audio push desk:channel2\n"
    "connect desk:out push tape:audio\n"
    "sequence (beat (tape (desk (low high))))\n"
    "set desk:channel2:gain=-20\n";

TEST(MediaHost, playsWhatATextFileDescribes) {
    const TestFolder folder;
    const std::string path = folder / "tones.pipeline";
    // A device that takes no part, named as a piece of the name of one that does.
    writeFile(path, TWO_TONES + std::string("device be tone\nout \"") + (folder / "out") + "\"\n");
    const HostRun run = runHost("run " + path);
    ASSERT_EQ(run.code, 0) << run.output;
    const Wave wave = readWave(folder / "out/sound.wav");
    ASSERT_EQ(wave.samples.size(), 2u * 48000);
    const auto findHighest = [&wave](std::size_t first, std::size_t end) {
        int highest = 0;
        for (std::size_t i = first * 2; i < end * 2; ++i)
            highest = std::max<int>(highest, wave.samples[i]);
        return highest;
    };
    EXPECT_NEAR(findHighest(1000, 23000), 0.270 * 32768, 160);  // both; their crests do not meet
    EXPECT_NEAR(findHighest(25000, 47000), 0.025 * 32768, 4);   // the one that is left
    EXPECT_THAT(runHost("graph " + path).output, HasSubstr("\"desk\" -> \"high\" [style=dashed"));
}

TEST(MediaHost, namesFileLineAndExpectationForABadPipeline) {
    struct Row {
        const char* line;
        const char* expected;
    };
    const Row rows[] = {
        {"devise a tone", "expected device, connect, sequence"},
        {"device a", "expected device NAME KIND [SETTING=VALUE]..."},
        {"device low tone", "expected a name that no other device has, got \"low\""},
        {"device a organ", "expected a kind of device (one of reader pattern"},
        {"device a tone volume=3", "there is no setting \"volume\""},
        {"device a tone hertz=x", "the setting hertz=x is no number from 1 to 20000"},
        {"device a tone hertz", "expected SETTING=VALUE, got \"hertz\""},
        {"connect low:audio desk:channel3",
         "expected connect DEVICE:STREAM push|pull DEVICE:STREAM"},
        {"connect low:audio push desk:channel3", "cannot connect \"low:audio push desk:channel3\""},
        {"connect low:video push desk:channel3", "cannot connect"},
        {"connect desk:out push nobody:audio", "Device name not found in the registry. (nobody)"},
        {"sequence (beat)", "expected one line \"sequence\""},
        {"set desk:channel2:gain", "expected DEVICE:PROPERTY=VALUE"},
        {"set desk:channel2:gain=20", "out of range"},
        {"loops \"2", "expected a closing quote"},
        {"reverse now", "expected nothing behind \"reverse\""},
        {"cache", "expected a size, got nothing"},
    };
    const TestFolder folder;
    const std::string path = folder / "bad.pipeline";
    for (const Row& row : rows) {
        writeFile(path, TWO_TONES + std::string(row.line) + '\n');
        const HostRun run = runHost("run " + path);
        EXPECT_EQ(run.code, 1) << row.line;
        EXPECT_THAT(run.output, HasSubstr("bad.pipeline:12")) << row.line;
        EXPECT_THAT(run.output, HasSubstr(row.expected)) << row.line;
    }
    writeFile(path, "device a tone\nsequence (a\n");
    const HostRun run = runHost("run " + path);
    EXPECT_THAT(run.output, HasSubstr("bad.pipeline:2: cannot arrange the sequence \"(a\""));
    EXPECT_THAT(run.output, HasSubstr("Configuration string Syntax error."));
}

TEST(MediaHost, failsAsAWholeWhereAFileCannotBeWritten) {
    const TestFolder folder;
    writeFile(folder / "file", "in the way");
    const HostRun inFile = runHost("play simulated --out " + (folder / "file/out"));
    EXPECT_EQ(inFile.code, 1);
    EXPECT_THAT(inFile.output, HasSubstr("cannot create the folder"));
    // A folder where the recorder wants its file.
    std::filesystem::create_directories(folder / "out/sound.wav.part");
    const HostRun inWay =
        runHost("play simulated:64x48@25,60 --rate realtime --out " + (folder / "out"));
    EXPECT_EQ(inWay.code, 1) << inWay.output;
    EXPECT_THAT(inWay.output, HasSubstr("device \"recorder\" has failed"));
    EXPECT_THAT(inWay.output, HasSubstr("cannot create \""));
    EXPECT_FALSE(std::filesystem::exists(folder / "out/sound.wav"));
    EXPECT_TRUE(findFaults(inWay.output).empty());
}

}  // namespace

}  // namespace Orv
