#include "readerDevice.h"

namespace MediaHost {

ReaderDevice::ReaderDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : SourceDevice(name, context),
      _file(settings.getText("file", "")),
      _nbThreads(settings.getNumber("threads", 0, 0, 64)) {
    settings.check();
    addFileProperties();
    // Without a file it only tells what it can do.
    if (!_file.empty()) openFile();
}

void ReaderDevice::addFileProperties() {
    addProperty<TextValue>("file", "what is read", [this] { return toTextValue(_file); });
    addProperty<TextValue>("codecs", "what decodes it", [this] { return toTextValue(_codecs); });
    addProperty<int>("threads", "that decode pictures; 0: one per processor",
                     [this] { return static_cast<int>(_nbThreads); });
}

}  // namespace MediaHost
