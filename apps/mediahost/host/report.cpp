#include "report.h"

#include <cmath>
#include <iomanip>
#include <orv/buildInfo.h>
#include <ostream>

#include "outputFile.h"
#include "process.h"
#include "propertyText.h"

namespace MediaHost {

namespace {

constexpr double GET_SECONDS = 2;

double toMegabytes(std::uint64_t nbBytes) {
    return static_cast<double>(nbBytes) / (1 << 20);
}

double toNumber(const std::string& text) {
    return text.empty() ? 0 : std::strtod(text.c_str(), nullptr);
}

}  // namespace

Report::Report(Host& host, bool isWhole)
    : _host(host),
      _isWhole(isWhole),
      _peakBytes(Process::getPeakBytes()),
      _processorSeconds(Process::getProcessorSeconds()) {
    for (const Pipeline::Device& device : host.getPipeline().devices) collect(device);
}

void Report::collect(const Pipeline::Device& spec) {
    Device device{spec.name, spec.kind, 0, {}};
    if (_host.isInSequence(spec.name)) {
        device.latencySeconds = _host.getSequence().getLatency(spec.name.c_str()).getSeconds();
    }
    const auto prtcl =
        Orv::RCShdPtr<Orv::DevMDPropertyPrtcl>::dynamicCast(_host.getDevice(spec.name));
    if (!prtcl.isNull()) {
        collectProperties(device, prtcl->getPropertyIter(), "");
        for (const auto& set : prtcl->getPropertySetIter()) {
            collectProperties(device, set->getPropertyIter(),
                              std::string(set->getName().getText()) + ':');
        }
    }
    count(device);
    _devices.push_back(std::move(device));
}

void Report::collectProperties(Device& device, Orv::DevMDPropertySet::Properties properties,
                               const std::string& prefix) {
    for (const auto& property : properties) {
        const std::string type = PropertyText::getTypeName(property);
        const bool isList = type.ends_with("[]");
        if (isList || (property->getAttributes() & Orv::DevMDPropertyAny::READABLE) == 0) continue;
        const auto descriptor = property->getDescriptor();
        device.properties.push_back({prefix + property->getName().getChars(), type,
                                     descriptor.isNull() ? "" : descriptor->getUnit().getChars(),
                                     PropertyText::get(property, GET_SECONDS)});
    }
}

std::string Report::find(const Device& device, const char* property) const {
    for (const Property& known : device.properties) {
        if (known.name == property) return known.value;
    }
    return {};
}

void Report::count(const Device& device) {
    const auto number = [&](const char* name) {
        return static_cast<std::int64_t>(toNumber(find(device, name)));
    };
    _nbShown += number("video:shown");
    _nbDropped += number("video:dropped");
    _nbDecoded += number("video:decoded");
    if (device.kind == "scope") _soundSeconds = toNumber(find(device, "seconds"));
    const std::int64_t nbFaults = number("video:faults") + number("audio:faults");
    if (nbFaults > 0) {
        _faults.push_back(device.name + ": " + std::to_string(nbFaults) +
                          " damaged pieces were left out");
    }
    if (number("video:dropped") > 0) {
        _faults.push_back(device.name + ": " + std::to_string(number("video:dropped")) +
                          " pictures came too late and were dropped");
    }
    const double duration = toNumber(find(device, "duration"));
    const double rate = toNumber(find(device, "rate"));
    const Pipeline& pipeline = _host.getPipeline();
    if (!_isWhole || device.kind != "reader" || pipeline.nbLoops == 0 || duration == 0 || rate == 0)
        return;
    const double seconds = static_cast<double>(number("video:shown") + number("video:dropped")) /
                           rate / static_cast<double>(pipeline.nbLoops);
    if (seconds < duration * 0.98 - 0.5) {
        _faults.push_back(device.name + ": the file ends early, after " +
                          std::to_string(seconds).substr(0, 5) + " s of " +
                          std::to_string(duration).substr(0, 5) + " s");
    }
}

void Report::print(std::ostream& stream) const {
    const HostContext& context = _host.getContext();
    const Orv::MbManagerStatistics cache = context.getCacheStatistics();
    const double seconds = _host.getPlayedSeconds();
    stream << std::fixed << std::setprecision(2);
    stream << (_isWhole ? "played" : "interrupted after") << ' ' << seconds << " s\n";
    if (_nbShown + _nbDropped > 0) {
        stream << "pictures   " << _nbShown << " shown, " << _nbDropped << " dropped, "
               << _nbDecoded << " decoded, "
               << static_cast<double>(_nbShown) / std::max(seconds, 1e-3)
               << " per second; the first after " << context.getFirstPictureSeconds() * 1e3
               << " ms\n"
               << "cache      " << toMegabytes(cache.bytesInUse) << " of "
               << toMegabytes(context.cacheBytes) << " MB in use, " << cache.counts.nbHits
               << " hits, " << cache.counts.nbReloads << " loads, " << cache.counts.nbEvictions
               << " given way\n";
    }
    stream << "sound      " << _soundSeconds << " s\n";
    if (context.isPaced) {
        const Pacer::Lateness late = context.pacer.getLateness();
        stream << "beats      " << late.nbBeats << ", late by " << late.p50Seconds * 1e3
               << " ms (half), " << late.p99Seconds * 1e3 << " ms (99 %), " << late.maxSeconds * 1e3
               << " ms (most)\n";
    }
    stream << "memory     " << toMegabytes(_peakBytes) << " MB at most; processor "
           << _processorSeconds << " s\n";
    for (const std::string& fault : _faults) stream << "fault      " << fault << '\n';
    if (!context.folder.empty()) stream << "files      in " << context.folder.string() << '\n';
    stream << std::flush;
}

void Report::write(const std::filesystem::path& path) const {
    OutputFile file(path);
    {
        Orv::XmlStreamer streamer(file.getStream(), true);
        Element root(streamer, "mediahost");
        root.addAttribute("library", Orv::BuildInfo::getInstance().getVersion());
        root.addAttribute("whole", _isWhole ? "true" : "false");
        writeShow(root);
        writeMachine(root);
        for (const Device& device : _devices) writeDevice(root, device);
        for (const std::string& connection : _host.getConnections()) {
            Element element(root, "connection");
            element.addAttribute("string", connection.c_str());
        }
        for (const std::string& fault : _faults) {
            Element element(root, "fault");
            element.addAttribute("text", fault.c_str());
        }
    }
    file.commit();
}

void Report::writeShow(Element& root) const {
    const HostContext& context = _host.getContext();
    Element show(root, "show");
    show.addAttribute("rate", _host.getPipeline().rate.c_str());
    show.addAttribute("timecode", _host.getPipeline().timecode.c_str());
    show.addAttribute("sequence", _host.getTree().c_str());
    show.addAttribute("seconds", _host.getPlayedSeconds());
    show.addAttribute("pictures", static_cast<long long>(_nbShown));
    show.addAttribute("dropped", static_cast<long long>(_nbDropped));
    show.addAttribute("decoded", static_cast<long long>(_nbDecoded));
    show.addAttribute("soundSeconds", _soundSeconds);
    show.addAttribute("firstPictureSeconds", context.getFirstPictureSeconds());
}

void Report::writeMachine(Element& root) const {
    const HostContext& context = _host.getContext();
    {
        const Orv::MbBufferStatistics counts = context.getCacheStatistics().counts;
        Element element(root, "cache");
        element.addAttribute("strategy", _host.getPipeline().strategy.c_str());
        element.addAttribute("budgetBytes", static_cast<unsigned long long>(context.cacheBytes));
        element.addAttribute("hits", static_cast<unsigned long long>(counts.nbHits));
        element.addAttribute("loads", static_cast<unsigned long long>(counts.nbReloads));
        element.addAttribute("evictions", static_cast<unsigned long long>(counts.nbEvictions));
    }
    if (context.isPaced) {
        const Pacer::Lateness late = context.pacer.getLateness();
        Element element(root, "beats");
        element.addAttribute("number", static_cast<unsigned long long>(late.nbBeats));
        element.addAttribute("p50Seconds", late.p50Seconds);
        element.addAttribute("p99Seconds", late.p99Seconds);
        element.addAttribute("maxSeconds", late.maxSeconds);
    }
    Element element(root, "process");
    element.addAttribute("peakBytes", static_cast<unsigned long long>(_peakBytes));
    element.addAttribute("processorSeconds", _processorSeconds);
}

void Report::writeDevice(Element& root, const Device& device) {
    Element element(root, "device");
    element.addAttribute("name", device.name.c_str());
    element.addAttribute("kind", device.kind.c_str());
    element.addAttribute("inStepAfterSeconds", device.latencySeconds);
    for (const Property& property : device.properties) {
        Element child(element, "property");
        child.addAttribute("name", property.name.c_str());
        child.addAttribute("type", property.type.c_str());
        if (!property.unit.empty()) child.addAttribute("unit", property.unit.c_str());
        child.addAttribute("value", property.value.c_str());
    }
}

namespace {

void describeProperties(Orv::DevMDPropertySet::Properties properties, const std::string& prefix,
                        std::ostream& stream) {
    for (const auto& property : properties) {
        const unsigned attributes = property->getAttributes();
        const bool isReadable = (attributes & Orv::DevMDPropertyAny::READABLE) != 0;
        const bool isWritable = (attributes & Orv::DevMDPropertyAny::WRITABLE) != 0;
        stream << "  " << std::left << std::setw(26) << prefix + property->getName().getChars()
               << ' ' << std::setw(8) << PropertyText::getTypeName(property)
               << (isReadable ? " r" : " -") << (isWritable ? "w" : "-") << "  "
               << property->getDescription();
        if (const auto descriptor = property->getDescriptor(); !descriptor.isNull()) {
            if (!descriptor->getUnit().isEmpty()) stream << "; unit " << descriptor->getUnit();
            if (!descriptor->getRangeText().isEmpty()) stream << "; " << descriptor->getRangeText();
            if (!descriptor->getDefaultText().isEmpty()) {
                stream << "; at first " << descriptor->getDefaultText();
            }
        }
        stream << '\n';
    }
}

std::string quote(const std::string& text) {
    return '"' + text + '"';
}

}  // namespace

void describeDevice(Host& host, const std::string& name, std::ostream& stream) {
    const Orv::RCShdPtr<Orv::DevMDPrtcl> device = host.getDevice(name);
    stream << name << "\nproperties\n";
    if (const auto prtcl = Orv::RCShdPtr<Orv::DevMDPropertyPrtcl>::dynamicCast(device);
        !prtcl.isNull()) {
        describeProperties(prtcl->getPropertyIter(), "", stream);
        for (const auto& set : prtcl->getPropertySetIter()) {
            describeProperties(set->getPropertyIter(), std::string(set->getName().getText()) + ':',
                               stream);
        }
    }
    stream << "streams\n";
    if (const auto prtcl = Orv::RCShdPtr<Orv::DevMDStreamPrtcl>::dynamicCast(device);
        !prtcl.isNull()) {
        for (const auto& end : prtcl->performGetStreams()) {
            const bool isSource = !Orv::RCShdPtr<Orv::DevMDStreamSource>::dynamicCast(end).isNull();
            stream << "  " << std::left << std::setw(26) << end->getName().getChars()
                   << (isSource ? " out      " : " in       ") << end->getDescription() << '\n';
        }
    }
}

void writeGraph(Host& host, std::ostream& stream) {
    stream << "digraph mediahost {\n  rankdir=LR;\n  node [shape=box, style=rounded];\n";
    for (const Pipeline::Device& device : host.getPipeline().devices) {
        stream << "  " << quote(device.name)
               << " [label=" << quote(device.name + "\\n" + device.kind) << "];\n";
    }
    for (const std::string& connection : host.getConnections()) {
        const std::string source = connection.substr(0, connection.find(':'));
        const std::size_t second = connection.rfind(' ') + 1;
        const std::string sink = connection.substr(second, connection.find(':', second) - second);
        const std::string label = connection.substr(
            connection.find(':') + 1, connection.find(' ') - connection.find(':') - 1);
        stream << "  " << quote(source) << " -> " << quote(sink) << " [label=" << quote(label)
               << "];\n";
    }
    // The sequence: who leads whom.
    std::vector<std::string> leaders;
    std::string name;
    std::string last;
    const auto take = [&] {
        if (name.empty()) return;
        last = name;
        if (!leaders.empty() && !leaders.back().empty()) {
            stream << "  " << quote(leaders.back()) << " -> " << quote(name)
                   << " [style=dashed, color=gray, constraint=false];\n";
        }
        name.clear();
    };
    for (const char c : host.getTree()) {
        if (c == '(') {
            take();
            leaders.push_back(leaders.empty() ? std::string() : last);
        } else if (c == ')' || c == ' ') {
            take();
            if (c == ')' && !leaders.empty()) leaders.pop_back();
        } else {
            name += c;
        }
    }
    stream << "}\n";
}

}  // namespace MediaHost
