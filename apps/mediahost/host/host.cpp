#include "host.h"

#include <algorithm>
#include <cstring>
#include <iostream>
#include <orv/devMgrEx.h>
#include <orv/devMgrPropertyObserverUtil.h>
#include <orv/devRegistry.h>
#include <orv/devRegistryDeviceEntry.h>
#include <orv/liTimeCodeFilm24.h>
#include <orv/liTimeCodeNtscDf.h>
#include <orv/liTimeCodeNtscNd.h>
#include <orv/liTimeCodePal.h>
#include <orv/lkGuard.h>

#include "clockDevice.h"
#include "displayDevice.h"
#include "mixerDevice.h"
#include "process.h"
#include "progress.h"
#include "propertyText.h"
#include "readerDevice.h"
#include "recorderDevice.h"
#include "scopeDevice.h"
#include "simulatedDevices.h"
#include "speakerDevice.h"

namespace MediaHost {

namespace {

constexpr double ANSWER_SECONDS = 2;

using Entry = Orv::ObjPtr<Orv::DevRegistryEntry>;
using Create = Entry (*)(const Pipeline::Device&, const char* description, HostContext&);

template <class Device>
Entry createEntry(const Pipeline::Device& device, const char* description, HostContext& context) {
    const Settings settings = device.settings;
    return Entry(new Orv::DevRegistryDeviceEntry(
        device.name.c_str(), description, [name = device.name, settings, &context] {
            return Orv::RCShdPtr<Orv::DevMDPrtcl>(new Device(name.c_str(), context, settings));
        }));
}

const std::pair<DeviceKind, Create> KINDS[] = {
    {{"reader", "reads a file of any kind that FFmpeg knows"}, createEntry<ReaderDevice>},
    {{"pattern", "colour bars with burnt-in timecode; needs no file"}, createEntry<PatternDevice>},
    {{"tone", "a sine tone with a click each second; needs no file"}, createEntry<ToneDevice>},
    {{"mixer", "adds four channels of sound, with gains, mutes and meters"},
     createEntry<MixerDevice>},
    {{"scope", "levels of the sound, and a picture of its waveform"}, createEntry<ScopeDevice>},
    {{"display", "a window, and a contact sheet of the pictures"}, createEntry<DisplayDevice>},
    {{"speaker", "lets the sound be heard"}, createEntry<SpeakerDevice>},
    {{"recorder", "writes sound as WAV, and pictures as PNG or as a film"},
     createEntry<RecorderDevice>},
    {{"clock", "beats the time for all others, by the sync engine"}, createEntry<ClockDevice>},
};

Orv::RCShdPtr<Orv::LiTimeCode> createTimecode(const std::string& name) {
    if (name == "film24") return Orv::LiTimeCodeFilm24::create();
    if (name == "ntsc-nd") return Orv::LiTimeCodeNtscNd::create();
    if (name == "ntsc-df") return Orv::LiTimeCodeNtscDf::create();
    return Orv::LiTimeCodePal::create();
}

/// Runs some work; what it throws is nested in "what".
template <class Work>
decltype(auto) doing(const std::string& what, Work work) {
    try {
        return work();
    } catch (...) {
        throwBecause(what);
    }
}

}  // namespace

const std::vector<DeviceKind>& listKinds() {
    static const std::vector<DeviceKind> KINDS_ONLY = [] {
        std::vector<DeviceKind> kinds;
        for (const auto& [kind, create] : KINDS) kinds.push_back(kind);
        return kinds;
    }();
    return KINDS_ONLY;
}

/// A property that is printed when it has changed.
class Host::Watch {
public:
    Watch(const std::string& name, const Orv::RCShdPtr<Orv::DevMDPropertyAny>& property)
        : _name(name), _property(property) {}

    // What is read is the value of now, so several notices in a row may find the same one.
    void print() {
        const Orv::LkGuard guard(_mutex);
        std::string value = PropertyText::get(_property, ANSWER_SECONDS);
        if (value == _last) return;
        std::cout << std::to_string(Process::getSecondsSinceStart()) + " s  " + _name + " = " +
                         value + '\n'
                  << std::flush;
        _last = std::move(value);
    }

private:
    const std::string _name;
    const Orv::RCShdPtr<Orv::DevMDPropertyAny> _property;
    Orv::LkMutex _mutex{"Watch"};
    std::string _last;
};

Host::Host(Pipeline pipeline) : _pipeline(std::move(pipeline)) {
    applyOptions();
}

Host::~Host() {
    // In the order in which one uses the other; the manager closes the devices.
    _watches.reset();
    _watched.clear();
    _sequence.reset();
    _context.pacer.stop();
    _streams.reset();
    _properties.reset();
    _manager.reset();
    for (const std::string& name : _registered) {
        Orv::DevRegistry::getInstance().removeEntry(name.c_str());
    }
}

void Host::applyOptions() {
    _context.cacheBytes = _pipeline.cacheBytes;
    _context.cachePictures = _pipeline.cachePictures;
    _context.isCacheRandom = _pipeline.strategy == "random";
    _context.timecode = createTimecode(_pipeline.timecode);
    _context.folder = _pipeline.folder;
    _context.isPaced = _pipeline.rate != "fast";
    if (_context.isPaced && _pipeline.rate != "realtime")
        _context.speed = std::stod(_pipeline.rate);
    _context.isReverse = _pipeline.isReverse;
    _context.nbLoops = _pipeline.nbLoops;
}

void Host::registerDevices() {
    for (const Pipeline::Device& device : _pipeline.devices) {
        doing(device.where, [&] {
            const auto* kind =
                std::find_if(std::begin(KINDS), std::end(KINDS),
                             [&](const auto& entry) { return entry.first.name == device.kind; });
            if (kind == std::end(KINDS)) {
                std::string names;
                for (const auto& [known, create] : KINDS) names += std::string(" ") + known.name;
                throw MediaError("expected a kind of device (one of" + names + "), got \"" +
                                 device.kind + '"');
            }
            Orv::DevRegistry::getInstance().addEntry(
                kind->second(device, kind->first.description, _context));
            _registered.push_back(device.name);
        });
    }
}

void Host::createFolder() {
    if (_context.folder.empty()) return;
    std::error_code error;
    std::filesystem::create_directories(_context.folder, error);
    if (error) {
        throw MediaError("cannot create the folder \"" + _context.folder.string() +
                         "\": " + error.message());
    }
}

void Host::open() {
    createFolder();
    registerDevices();
    _manager = Orv::DevMgr::create();
    _properties = _manager->createPropertyAcc();
    _watches = _manager->createPropertyAcc();
    _streams = _manager->createStreamAcc();
    _sequence = _manager->createSyncSeqAcc();
    for (const Pipeline::Device& device : _pipeline.devices) {
        doing(device.where + ": cannot open the " + device.kind + " \"" + device.name + '"',
              [&] { getDevice(device.name); });
    }
    noteRate();
    for (const Pipeline::Line& line : _pipeline.sets) {
        const std::size_t equals = line.text.find('=');
        doing(line.where, [&] {
            if (equals == std::string::npos) {
                throw MediaError("expected DEVICE:PROPERTY=VALUE, got \"" + line.text + '"');
            }
            setProperty(line.text.substr(0, equals), line.text.substr(equals + 1));
        });
    }
    for (const Pipeline::Line& line : _pipeline.watches) {
        doing(line.where, [&] { watch(line.text); });
    }
}

// The clock beats as often as there are pictures, unless it is set otherwise.
void Host::noteRate() {
    for (const Pipeline::Device& device : _pipeline.devices) {
        const auto source = Orv::RCShdPtr<SourceDevice>::dynamicCast(getDevice(device.name));
        if (source.isNull() || source->getPictureFormat() == nullptr) continue;
        _context.beatsPerSecond = source->getPictureFormat()->rate.toDouble();
        return;
    }
}

Orv::RCShdPtr<Orv::DevMDPrtcl> Host::getDevice(const std::string& name) {
    return _manager->getPrtcl(name.c_str());
}

std::string Host::getProperty(const std::string& property) {
    return doing("cannot get the property \"" + property + '"', [&] {
        return PropertyText::get(_properties->getProperty(property.c_str()), ANSWER_SECONDS);
    });
}

void Host::setProperty(const std::string& property, const std::string& value) {
    doing("cannot set the property \"" + property + "\" to \"" + value + '"', [&] {
        PropertyText::set(_properties->getProperty(property.c_str()), value, ANSWER_SECONDS);
    });
}

void Host::watch(const std::string& property) {
    doing("cannot watch the property \"" + property + '"', [&] {
        const auto watched =
            std::make_shared<Watch>(property, _watches->getProperty(property.c_str()));
        Orv::DevMgrPropertyObserverUtil::attachObserver(
            *_watches, property.c_str(),
            Orv::DevMgrPropertyFunctionObserver::create(
                [watched](const Orv::DevMgrPropertyObserverHint&) { watched->print(); }));
        _watched.push_back(watched);
    });
}

void Host::connect() {
    if (_pipeline.connections.empty()) connectStandard();
    for (const Pipeline::Line& line : _pipeline.connections) {
        doing(line.where + ": cannot connect \"" + line.text + '"', [&] {
            _streams->connect(line.text.c_str());
            _connections.push_back(line.text);
        });
    }
    _tree = _pipeline.sequence.text.empty() ? makeTree() : _pipeline.sequence.text;
    const std::string where =
        _pipeline.sequence.where.empty() ? "" : _pipeline.sequence.where + ": ";
    doing(where + "cannot arrange the sequence \"" + _tree + '"',
          [&] { _sequence->configure(_tree.c_str()); });
}

// Every source to the first mixer and the first display, and on to scope and recorder.
void Host::connectStandard() {
    const auto find = [this](const std::string& kind) -> const Pipeline::Device* {
        for (const Pipeline::Device& device : _pipeline.devices) {
            if (device.kind == kind) return &device;
        }
        return nullptr;
    };
    const auto* mixer = find("mixer");
    const auto* scope = find("scope");
    const auto* speaker = find("speaker");
    const auto* display = find("display");
    const auto* recorder = find("recorder");
    int nbChannels = 0;
    bool hasPictures = false;
    for (const Pipeline::Device& device : _pipeline.devices) {
        const auto source = Orv::RCShdPtr<SourceDevice>::dynamicCast(getDevice(device.name));
        if (source.isNull()) continue;
        if (source->getPictureFormat() != nullptr && display != nullptr && !hasPictures) {
            hasPictures = true;
            _pipeline.connect(device.name + ":video push " + display->name + ":video");
        }
        if (source->getSoundFormat() != nullptr && mixer != nullptr &&
            nbChannels < MixerDevice::NB_CHANNELS) {
            _pipeline.connect(device.name + ":audio push " + mixer->name + ":channel" +
                              std::to_string(++nbChannels));
        }
    }
    if (hasPictures && recorder != nullptr) {
        _pipeline.connect(display->name + ":through push " + recorder->name + ":video");
    }
    if (nbChannels > 0 && scope != nullptr) {
        _pipeline.connect(mixer->name + ":out push " + scope->name + ":audio");
        const auto* last = scope;
        if (speaker != nullptr) {
            _pipeline.connect(last->name + ":through push " + speaker->name + ":audio");
            last = speaker;
        }
        if (recorder != nullptr) {
            _pipeline.connect(last->name + ":through push " + recorder->name + ":audio");
        }
    }
}

// One below the other, those that take below nobody but the clock, sources last: so what a device
// needs is started before it and stopped after it.
std::string Host::makeTree() const {
    static const char* const ORDER[] = {"clock", "recorder", "speaker",
                                        "scope", "mixer",    "display"};
    std::vector<std::string> leaders;
    std::string sources;
    for (const char* kind : ORDER) {
        for (const Pipeline::Device& device : _pipeline.devices) {
            if (device.kind == kind) leaders.push_back(device.name);
        }
    }
    for (const Pipeline::Device& device : _pipeline.devices) {
        if (std::find(leaders.begin(), leaders.end(), device.name) == leaders.end()) {
            sources += (sources.empty() ? "" : " ") + device.name;
        }
    }
    if (!sources.empty()) leaders.push_back(sources);
    std::string tree;
    for (const std::string& leader : leaders) tree += (tree.empty() ? "(" : " (") + leader;
    return tree + std::string(leaders.size(), ')');
}

bool Host::isInSequence(const std::string& device) const {
    const auto isEdge = [this](std::size_t at) {
        return at >= _tree.size() || std::strchr("() ", _tree[at]) != nullptr;
    };
    for (std::size_t at = _tree.find(device); at != std::string::npos;
         at = _tree.find(device, at + 1)) {
        if ((at == 0 || isEdge(at - 1)) && isEdge(at + device.size())) return true;
    }
    return false;
}

bool Host::play() {
    _sequence->start();
    _sequence->sync(Orv::DtTime(0.0));
    bool isWhole = waitInStep();
    if (isWhole) isWhole = waitForEnd();
    _playedSeconds = _context.pacer.getSecondsSinceStart();
    if (!isWhole) {
        std::cout << "interrupted: stopping in order; once more ends at once" << std::endl;
    }
    stop();
    _streams.reset();
    _watches.reset();
    for (const auto& watched : _watched) watched->print();  // the notice of it may still be due
    _context.rethrowFailure();
    return isWhole;
}

// As the sequence's, with the devices that have failed named in the error.
bool Host::waitFor(const char* state, double seconds) {
    try {
        return _sequence->waitFor(state, seconds);
    } catch (const Orv::DevMgrEx::SMExecutionError&) {
        _context.rethrowFailure();  // a device's own words are better
        std::string failures = "the sequence \"" + _tree + "\" has failed";
        for (const Pipeline::Device& device : _pipeline.devices) {
            if (!isInSequence(device.name)) continue;
            const Orv::LiString failure = _sequence->getFailure(device.name.c_str());
            if (!failure.isEmpty()) failures += "; " + device.name + ": " + failure.getChars();
        }
        throwBecause(failures);
    }
}

bool Host::waitInStep() {
    while (!waitFor("lock", 0.05)) {
        _context.rethrowFailure();
        if (Process::isInterrupted()) return false;
    }
    if (!_context.isEndExpected()) {
        throw MediaError("no stream leads to a device of the sequence \"" + _tree +
                         "\": nothing would ever end");
    }
    return true;
}

bool Host::waitForEnd() {
    Progress progress(*this);
    while (!_context.hasEnded()) {
        if (Process::isInterrupted()) return false;
        _context.waitForNews(0.1);
        progress.show();
    }
    return true;
}

void Host::stop() {
    _sequence->stop();
    if (waitFor("final", _pipeline.patienceSeconds)) return;
    _sequence->abort();
    if (waitFor("final", _pipeline.patienceSeconds)) return;
    std::string states;
    for (const Pipeline::Device& device : _pipeline.devices) {
        if (!isInSequence(device.name)) continue;
        const std::string state = _sequence->getState(device.name.c_str()).getChars();
        if (state != "final") states += ", " + device.name + " is in \"" + state + '"';
    }
    throw DevicesHang("the devices do not stop and were given up" + states);
}

}  // namespace MediaHost
