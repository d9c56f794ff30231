#include "scopeDevice.h"

#include <algorithm>
#include <cmath>

#include "pngFile.h"

namespace MediaHost {

ScopeDevice::ScopeDevice(const Orv::LiString& name, HostContext& context, Settings settings)
    : MediaDevice(name, context) {
    settings.check();
    addInput<SoundBuf>("audio", "sound/*",
                       [this](const Orv::RCShdPtr<SoundBuf>& buf) { take(buf); });
    _through = addOutput("through", "sound/float");
    addProperty<float>("level:peak", "highest magnitude until now, 1 being full scale",
                       [this] { return _peak; });
    addProperty<double>("level:rms", "root of the mean square until now", [this] {
        return _nbSamples > 0 ? std::sqrt(_sumOfSquares / static_cast<double>(_nbSamples)) : 0;
    });
    addProperty<double>("seconds", "sound seen until now", [this] {
        return _format.rate > 0 ? static_cast<double>(_nbSamples) / _format.rate : 0;
    });
    addProperty<Orv::Vector<float>>("waveform:lowest", "of equal spans of time", [this] {
        Orv::Vector<float> values;
        for (const Extent& extent : _extents) values.push_back(extent.lowest);
        return values;
    });
    addProperty<Orv::Vector<float>>("waveform:highest", "of equal spans of time", [this] {
        Orv::Vector<float> values;
        for (const Extent& extent : _extents) values.push_back(extent.highest);
        return values;
    });
}

void ScopeDevice::take(const Orv::RCShdPtr<SoundBuf>& buf) {
    _format = buf->getFormat();
    const auto nbChannels = static_cast<std::size_t>(_format.nbChannels);
    const std::vector<float>& samples = buf->getSamples();
    for (std::size_t i = 0; i + nbChannels <= samples.size(); i += nbChannels) {
        float sum = 0;
        for (std::size_t side = 0; side < nbChannels; ++side) {
            sum += samples[i + side];
            _peak = std::max(_peak, std::abs(samples[i + side]));
        }
        add(sum / static_cast<float>(nbChannels));
    }
    _through->push(createElem(buf));
}

void ScopeDevice::add(float sample) {
    _sumOfSquares += static_cast<double>(sample) * static_cast<double>(sample);
    if (_nbSamples % _samplesPerExtent == 0) {
        if (_extents.size() == 2 * NB_COLUMNS) halve();
        _extents.push_back({sample, sample});
    }
    ++_nbSamples;
    Extent& extent = _extents.back();
    extent.lowest = std::min(extent.lowest, sample);
    extent.highest = std::max(extent.highest, sample);
}

// However long the sound is, the waveform stays of one size.
void ScopeDevice::halve() {
    for (std::size_t i = 0; i < NB_COLUMNS; ++i) {
        _extents[i].lowest = std::min(_extents[2 * i].lowest, _extents[2 * i + 1].lowest);
        _extents[i].highest = std::max(_extents[2 * i].highest, _extents[2 * i + 1].highest);
    }
    _extents.resize(NB_COLUMNS);
    _samplesPerExtent *= 2;
}

void ScopeDevice::draw() const {
    constexpr int WIDTH = static_cast<int>(NB_COLUMNS);
    constexpr int HEIGHT = 240;
    constexpr int MIDDLE = HEIGHT / 2;
    std::vector<std::uint8_t> pixels(std::size_t{WIDTH} * HEIGHT * 3);
    const RgbView view{pixels.data(), WIDTH, HEIGHT};
    fillRect(view, 0, 0, WIDTH, HEIGHT, {18, 22, 28});
    const double seconds = static_cast<double>(_nbSamples) / _format.rate;
    const double step = std::max(1.0, std::ceil(seconds / 12));
    for (double second = step; second < seconds; second += step) {
        const int x = static_cast<int>(second / seconds * WIDTH);
        fillRect(view, x, 0, 1, HEIGHT, {52, 60, 70});
        drawText(view, x + 4, HEIGHT - 12, 1, std::to_string(static_cast<long long>(second)) + " s",
                 {130, 140, 150});
    }
    fillRect(view, 0, MIDDLE, WIDTH, 1, {52, 60, 70});
    for (int x = 0; x < WIDTH; ++x) {
        const std::size_t first = static_cast<std::size_t>(x) * _extents.size() / WIDTH;
        const std::size_t end =
            std::max(first + 1, (static_cast<std::size_t>(x) + 1) * _extents.size() / WIDTH);
        Extent all = _extents[first];
        for (std::size_t i = first; i < end; ++i) {
            all.lowest = std::min(all.lowest, _extents[i].lowest);
            all.highest = std::max(all.highest, _extents[i].highest);
        }
        const int top =
            MIDDLE - static_cast<int>(std::lround(std::clamp(all.highest, -1.0F, 1.0F) * MIDDLE));
        const int bottom =
            MIDDLE - static_cast<int>(std::lround(std::clamp(all.lowest, -1.0F, 1.0F) * MIDDLE));
        fillRect(view, x, top, 1, bottom - top + 1, {86, 196, 160});
    }
    writePng(getContext().folder / "waveform.png", view);
}

void ScopeDevice::finish(bool isWhole) {
    _through->push(createNews(Elem::END));
    if (isWhole && !getContext().folder.empty() && _nbSamples > 0) draw();
}

}  // namespace MediaHost
