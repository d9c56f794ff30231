// Real files: what comes out is what FFmpeg's own program decodes. The files are made by it; with
// ORV_CLIPS naming a folder, those in there are played, too.

#include <cstdlib>
#include <cstring>
#include <gtest/gtest.h>
#include <sstream>

#include "hostProgram.h"

namespace Orv {

namespace {

using testing::HasSubstr;

constexpr const char* FFMPEG = "ffmpeg -nostdin -v error -y ";

std::string quote(const std::string& path) {
    return '\'' + path + '\'';
}

/// Decodes pictures, and gives their checksums in order.
std::vector<std::string> decodePictures(const std::string& file) {
    std::istringstream lines(
        runCommand(FFMPEG + ("-i " + quote(file)) + " -map 0:v -fps_mode passthrough -f framemd5 -")
            .output);
    std::vector<std::string> checksums;
    for (std::string line; std::getline(lines, line);) {
        if (line[0] != '#') checksums.push_back(line.substr(line.rfind(' ') + 1));
    }
    return checksums;
}

std::vector<std::int16_t> decodeSound(const std::string& file) {
    const TestFolder folder;
    runCommand(FFMPEG + ("-i " + quote(file)) + " -map 0:a -f s16le " + (folder / "raw"));
    const std::string bytes = readFile(folder / "raw");
    std::vector<std::int16_t> samples(bytes.size() / 2);
    std::memcpy(samples.data(), bytes.data(), samples.size() * 2);
    return samples;
}

std::vector<std::string> getChecksums(const std::string& path) {
    std::vector<std::string> checksums;
    for (const FrameLine& line : readFrames(path)) checksums.push_back(line.checksum);
    return checksums;
}

class MediaHostFiles : public testing::Test {
protected:
    static void SetUpTestSuite() {
        _folder = new TestFolder;
        // Three seconds; different containers, codecs, rates, channels; a key picture each second.
        const std::string sources =
            " -f lavfi -i testsrc2=size=320x180:rate=25:duration=3"
            " -f lavfi -i sine=frequency=500:duration=3:sample_rate=44100 ";
        const auto make = [&](const char* name, const char* how) {
            const HostRun run = runCommand(FFMPEG + sources + how + ' ' + get(name));
            ASSERT_EQ(run.code, 0) << name;
        };
        make("h264.mp4", "-c:v libx264 -g 25 -bf 3 -pix_fmt yuv420p -c:a aac -ac 2");
        make("open.mpeg", "-c:v mpeg2video -g 12 -bf 2 -c:a mp2 -ar 48000");
        make("theora.ogg", "-c:v libtheora -q:v 7 -c:a libvorbis");
        make("old.avi", "-c:v mpeg4 -g 250 -bf 2 -c:a pcm_s16le");
        make("rgb.mkv", "-c:v ffv1 -pix_fmt yuv444p -c:a flac -ac 1");
        make("silent.mp4", "-map 0:v -c:v libx264 -pix_fmt yuv420p");
        make("blind.m4a", "-map 1:a -c:a aac");
    }
    static void TearDownTestSuite() { delete _folder; }

    static std::string get(const std::string& name) { return *_folder / name; }

    static std::vector<std::string> listFiles() {
        std::vector<std::string> files;
        for (const char* name : {"h264.mp4", "open.mpeg", "theora.ogg", "old.avi", "rgb.mkv"}) {
            files.push_back(get(name));
        }
        if (const char* clips = std::getenv("ORV_CLIPS"); clips != nullptr && *clips != 0) {
            for (const auto& entry : std::filesystem::directory_iterator(clips)) {
                files.push_back(entry.path().string());
            }
        }
        return files;
    }

    static TestFolder* _folder;
};

TestFolder* MediaHostFiles::_folder = nullptr;

TEST_F(MediaHostFiles, givesTheDecodersPicturesAndSamplesForwards) {
    for (const std::string& file : listFiles()) {
        SCOPED_TRACE(file);
        const TestFolder out;
        runHost("play " + quote(file) + " --checksums --out " + out.getPath());
        const std::vector<std::string> expected = decodePictures(file);
        ASSERT_GT(expected.size(), 70u);
        EXPECT_EQ(getChecksums(out / "frames.txt"), expected);
        EXPECT_EQ(readWave(out / "sound.wav").samples, decodeSound(file));
    }
}

TEST_F(MediaHostFiles, givesTheSamePicturesBackwardsInAnyBudget) {
    for (const std::string& file : listFiles()) {
        std::vector<std::string> expected = decodePictures(file);
        std::reverse(expected.begin(), expected.end());
        for (const char* cache : {"10frames", "40frames --strategy random", "1G"}) {
            SCOPED_TRACE(file + " --cache " + cache);
            const TestFolder out;
            runHost("play " + quote(file) + " --reverse --checksums --cache " + cache + " --out " +
                    out.getPath());
            EXPECT_EQ(getChecksums(out / "frames.txt"), expected);
        }
    }
}

TEST_F(MediaHostFiles, playsWithRoomForOnePicture) {
    const TestFolder forwards, backwards;
    const std::string play = "play " + get("h264.mp4") + " --cache 1frames --checksums --out ";
    ASSERT_EQ(runHost(play + forwards.getPath()).code, 0);
    ASSERT_EQ(runHost(play + backwards.getPath() + " --reverse").code, 0);
    std::vector<std::string> expected = decodePictures(get("h264.mp4"));
    EXPECT_EQ(getChecksums(forwards / "frames.txt"), expected);
    std::reverse(expected.begin(), expected.end());
    EXPECT_EQ(getChecksums(backwards / "frames.txt"), expected);
}

TEST_F(MediaHostFiles, playsFilesWithoutSoundOrWithoutPictures) {
    const TestFolder silent, blind;
    EXPECT_EQ(runHost("play " + get("silent.mp4") + " --checksums --out " + silent.getPath()).code,
              0);
    EXPECT_EQ(getChecksums(silent / "frames.txt"), decodePictures(get("silent.mp4")));
    EXPECT_FALSE(std::filesystem::exists(silent / "sound.wav"));
    EXPECT_EQ(runHost("play " + get("blind.m4a") + " --checksums --out " + blind.getPath()).code,
              0);
    EXPECT_EQ(readWave(blind / "sound.wav").samples, decodeSound(get("blind.m4a")));
    EXPECT_FALSE(std::filesystem::exists(blind / "frames.txt"));
}

/// How alike two films are, in dB; 0 if they cannot be compared.
double comparePictures(const std::string& one, const std::string& other) {
    const std::string log = runCommand("ffmpeg -nostdin -v info -i " + quote(one) + " -i " +
                                       quote(other) + " -lavfi psnr -f null - 2>&1")
                                .output;
    const std::size_t at = log.rfind("average:");
    return at == std::string::npos ? 0 : std::strtod(log.c_str() + at + 8, nullptr);
}

TEST_F(MediaHostFiles, encodesWhatItPlaysAsAFilm) {
    const TestFolder out;
    for (const char* name : {"film.avi", "film.mkv"}) {
        const HostRun run =
            runHost("play " + get("h264.mp4") + " --encode " + name + " --out " + out.getPath());
        ASSERT_EQ(run.code, 0) << run.output;
        EXPECT_EQ(decodePictures(out / name).size(), 75u) << name;
        EXPECT_GT(comparePictures(get("h264.mp4"), out / name), 30) << name;
    }
    const HostRun run =
        runHost("play " + get("h264.mp4") + " --encode film.doc --out " + out.getPath());
    EXPECT_EQ(run.code, 1) << run.output;
    EXPECT_THAT(run.output, HasSubstr("expected a name that ends as films do"));
    EXPECT_EQ(out.list(), (std::vector<std::string>{"contact-sheet.png", "film.avi", "film.mkv",
                                                    "report.xml", "sound.wav", "waveform.png"}));
}

// SDL's own stand-ins for a display and a loudspeaker take everything at the pace of real ones.
TEST_F(MediaHostFiles, showsAndPlaysLiveWithoutChangingWhatIsRecorded) {
    const TestFolder out;
    const HostRun run = runCommand(
        "SDL_VIDEODRIVER=dummy SDL_AUDIODRIVER=dummy ./orv-mediahost play simulated:64x48@25,1"
        " --window --sound --out " +
        out.getPath() + " 2>&1");
    EXPECT_NE(run.code, 1) << run.output;
    const std::string report = readFile(out / "report.xml");
    EXPECT_THAT(report, HasSubstr("rate=\"realtime\""));
    const std::size_t speaker = report.find("name=\"speaker\"");
    ASSERT_NE(speaker, std::string::npos);
    const auto read = [&](const std::string& property) {
        const std::size_t at = report.find("name=\"" + property + '"', speaker);
        return std::atoi(report.c_str() + report.find("value=\"", at) + 7);
    };
    EXPECT_GT(read("played"), 0);
    EXPECT_EQ(read("played") + read("dropped"), 48000);
    EXPECT_EQ(readWave(out / "sound.wav").samples.size(), 2u * 48000);
    // No such device is an error that says so.
    const HostRun deaf =
        runCommand("SDL_AUDIODRIVER=none ./orv-mediahost play simulated:64x48@25,1 --sound 2>&1");
    EXPECT_EQ(deaf.code, 1) << deaf.output;
    EXPECT_THAT(deaf.output, HasSubstr("sound cannot be heard: "));
}

TEST_F(MediaHostFiles, scalesPicturesWhereTheirSizeChangesOnTheWay) {
    const TestFolder folder;
    for (const char* size : {"160x120", "320x240"}) {
        runCommand(FFMPEG + std::string("-f lavfi -i testsrc2=size=") + size +
                   ":rate=25:duration=1 -c:v mpeg2video -f mpegts " + (folder / size));
    }
    writeFile(folder / "both.ts", readFile(folder / "160x120") + readFile(folder / "320x240"));
    const HostRun run =
        runHost("play " + (folder / "both.ts") + " --checksums --out " + (folder / "out"));
    EXPECT_NE(run.code, 1) << run.output;
    EXPECT_EQ(readFrames(folder / "out/frames.txt").size(),
              decodePictures(folder / "both.ts").size());
}

TEST_F(MediaHostFiles, tellsOfFilesThatCannotBeRead) {
    const TestFolder folder;
    writeFile(folder / "text.mp4", std::string(5000, 'x'));
    writeFile(folder / "empty.mp4", "");
    const std::string whole = readFile(get("h264.mp4"));
    writeFile(folder / "headless.mp4",
              whole.substr(0, whole.size() / 2));  // its table stood at the end
    for (const char* name : {"text.mp4", "empty.mp4", "headless.mp4", "missing.mp4"}) {
        const HostRun run = runHost("play " + (folder / name) + " --out " + (folder / "out"));
        EXPECT_EQ(run.code, 1) << name;
        EXPECT_THAT(run.output, HasSubstr("cannot open the reader \"reader\"")) << name;
        EXPECT_THAT(run.output, HasSubstr(std::string("/") + name + "\": ")) << name;
        EXPECT_FALSE(std::filesystem::exists(folder / "out/sound.wav")) << name;
    }
}

TEST_F(MediaHostFiles, playsWhatThereIsOfAFileThatWasCutOff) {
    const TestFolder folder;
    const std::string whole = readFile(get("open.mpeg"));
    writeFile(folder / "cut.mpeg", whole.substr(0, whole.size() / 2));
    const HostRun run =
        runHost("play " + (folder / "cut.mpeg") + " --checksums --out " + (folder / "out"));
    EXPECT_NE(run.code, 1) << run.output;
    const std::vector<std::string> all = decodePictures(get("open.mpeg"));
    const std::vector<std::string> played = getChecksums(folder / "out/frames.txt");
    ASSERT_GT(played.size(), 20u);
    ASSERT_LT(played.size(), all.size());
    EXPECT_EQ(played, decodePictures(folder / "cut.mpeg"));
    readWave(folder / "out/sound.wav");

    // A file that says how long it is, and is not.
    runCommand(FFMPEG + ("-i " + get("h264.mp4")) + " -c copy -movflags +faststart " +
               (folder / "fast.mp4"));
    const std::string fast = readFile(folder / "fast.mp4");
    writeFile(folder / "cut.mp4", fast.substr(0, fast.size() / 2));
    const HostRun cut = runHost("play " + (folder / "cut.mp4"));
    EXPECT_EQ(cut.code, 2) << cut.output;
    EXPECT_THAT(cut.output, HasSubstr("the file ends early"));
}

TEST_F(MediaHostFiles, leavesNothingThatLooksWholeOnAFullDisk) {
    const TestFolder out;
    // The limit of a file's size stands for a disk that is full.
    const HostRun run =
        runCommand("bash -c \"trap '' XFSZ; ulimit -f 100; exec ./orv-mediahost play " +
                   get("h264.mp4") + " --out " + out.getPath() + "\" 2>&1");
    EXPECT_EQ(run.code, 1) << run.output;
    EXPECT_THAT(run.output, HasSubstr("device \"recorder\" has failed"));
    EXPECT_THAT(run.output, HasSubstr("sound.wav\": "));
    for (const std::string& name : out.list()) {
        EXPECT_NE(name, "sound.wav");
        EXPECT_EQ(name.find(".part"), std::string::npos) << name;
    }
}

}  // namespace

}  // namespace Orv
