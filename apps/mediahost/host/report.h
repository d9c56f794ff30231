#pragma once

#include <orv/xmlStreamer.h>
#include <string>
#include <vector>

#include "host.h"

namespace MediaHost {

/// What a show has come to, for people and for programs.
class Report {
public:
    explicit Report(Host& host, bool isWhole);

    /// What was not as it should be: damaged pieces, an early end, pictures that came too late.
    const std::vector<std::string>& getFaults() const { return _faults; }

    void print(std::ostream& stream) const;
    void write(const std::filesystem::path& path) const;  ///< As XML.

private:
    using Element = Orv::XmlStreamer::ElementGuard;

    struct Property {
        std::string name, type, unit, value;
    };
    struct Device {
        std::string name, kind;
        double latencySeconds;
        std::vector<Property> properties;
    };

    Host& _host;
    const bool _isWhole;
    std::vector<Device> _devices;
    std::vector<std::string> _faults;
    std::int64_t _nbShown = 0, _nbDropped = 0, _nbDecoded = 0;
    double _soundSeconds = 0;
    std::uint64_t _peakBytes = 0;
    double _processorSeconds = 0;

    void collect(const Pipeline::Device& device);
    void collectProperties(Device& device, Orv::DevMDPropertySet::Properties properties,
                           const std::string& prefix);
    std::string find(const Device& device, const char* property) const;
    void count(const Device& device);
    void writeShow(Element& root) const;
    void writeMachine(Element& root) const;
    static void writeDevice(Element& root, const Device& device);
};

/// All properties of a device, as lines for people.
void describeDevice(Host& host, const std::string& name, std::ostream& stream);

/// Devices, streams and the sequence in the language of Graphviz.
void writeGraph(Host& host, std::ostream& stream);

}  // namespace MediaHost
