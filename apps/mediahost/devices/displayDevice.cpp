#include "displayDevice.h"

#include <algorithm>

#include "pngFile.h"
#include "window.h"

namespace MediaHost {

namespace {

constexpr int MARGIN = 8;
constexpr int CAPTION = 20;

}  // namespace

DisplayDevice::DisplayDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context), _hasWindow(settings.getNumber("window", 0, 0, 1) == 1) {
    settings.check();
    addInput<PictureBuf>("video", "picture/*",
                         [this](const Orv::RCShdPtr<PictureBuf>& buf) { take(buf); });
    _through = addOutput("through", "picture/*");
    addProperty<std::int64_t>("shown", "pictures until now", [this] { return _nbPictures; });
    addProperty<TextValue>("timecode", "of the latest picture", [this] {
        return toTextValue(std::string(getContext().timecode->getTimecode(_number).getText()));
    });
}

DisplayDevice::~DisplayDevice() noexcept(false) = default;

void DisplayDevice::open() {
    if (_hasWindow) _window = Window::create();
}

void DisplayDevice::take(const Orv::RCShdPtr<PictureBuf>& buf) {
    _number = buf->getNumber();
    if (_window) _window->show(buf->getFormat(), buf->getData());
    if (!getContext().folder.empty() && _nbPictures % _stride == 0) keep(*buf);
    ++_nbPictures;
    _through->push(createElem(buf));
}

void DisplayDevice::keep(const PictureBuf& buf) {
    if (_thumbnails.size() == NB_KEPT) {
        for (std::size_t i = 1; i < NB_SHOWN; ++i) _thumbnails[i] = std::move(_thumbnails[2 * i]);
        _thumbnails.resize(NB_SHOWN);
        _stride *= 2;
        if (_nbPictures % _stride != 0) return;
    }
    const PictureFormat& format = buf.getFormat();
    if (_height == 0) _height = std::clamp(WIDTH * format.height / format.width, 16, 4 * WIDTH);
    _thumbnails.push_back({buf.getNumber(), {}});
    _scaler.scale(format, buf.getData(), WIDTH, _height, _thumbnails.back().pixels);
}

void DisplayDevice::drawSheet() const {
    const std::size_t nbShown = std::min(NB_SHOWN, _thumbnails.size());
    const int nbRows = (static_cast<int>(nbShown) + NB_COLUMNS - 1) / NB_COLUMNS;
    const int width = NB_COLUMNS * (WIDTH + MARGIN) + MARGIN;
    const int height = nbRows * (_height + CAPTION) + MARGIN;
    std::vector<std::uint8_t> pixels(static_cast<std::size_t>(width) *
                                     static_cast<std::size_t>(height) * 3);
    const RgbView view{pixels.data(), width, height};
    fillRect(view, 0, 0, width, height, {18, 22, 28});
    for (std::size_t i = 0; i < nbShown; ++i) {
        const Thumbnail& thumbnail = _thumbnails[i * _thumbnails.size() / nbShown];
        const int left = MARGIN + static_cast<int>(i % NB_COLUMNS) * (WIDTH + MARGIN);
        const int top = MARGIN + static_cast<int>(i / NB_COLUMNS) * (_height + CAPTION);
        for (int y = 0; y < _height; ++y) {
            const std::uint8_t* row = thumbnail.pixels.data() + std::ptrdiff_t{y} * WIDTH * 3;
            std::copy(row, row + WIDTH * 3,
                      pixels.data() + ((std::ptrdiff_t{top} + y) * width + left) * 3);
        }
        const Orv::LiString text = getContext().timecode->getTimecode(thumbnail.number);
        drawText(view, left, top + _height + 4, 1, text.getText(), {200, 206, 212});
    }
    writePng(getContext().folder / "contact-sheet.png", view);
}

void DisplayDevice::finish(bool isWhole) {
    _through->push(createNews(Elem::END));
    if (isWhole && !_thumbnails.empty()) drawSheet();
}

void DisplayDevice::close() {
    _window.reset();
}

}  // namespace MediaHost
