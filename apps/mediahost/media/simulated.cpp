#include "simulated.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <numbers>

#include "font.h"

namespace MediaHost {

namespace {

// Seven bars of 75 %, as test pictures have them.
constexpr Rgb BARS[] = {{191, 191, 191}, {191, 191, 0}, {0, 191, 191}, {0, 191, 0},
                        {191, 0, 191},   {191, 0, 0},   {0, 0, 191}};
constexpr Rgb WHITE = {255, 255, 255};
constexpr Rgb BLACK = {16, 16, 16};

}  // namespace

PatternPictures::PatternPictures(int width, int height, const Orv::Rational& rate,
                                 std::int64_t nbPictures, Orv::RCShdPtr<Orv::LiTimeCode> timecode)
    : _nbPictures(nbPictures), _timecode(std::move(timecode)) {
    _format.width = width;
    _format.height = height;
    _format.rate = rate;
    _format.nbBytes = static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 3;
    _bars.resize(_format.nbBytes);
    const RgbView view{_bars.data(), width, height};
    constexpr int NB_BARS = static_cast<int>(std::size(BARS));
    for (int i = 0; i < NB_BARS; ++i) {
        const int left = width * i / NB_BARS;
        fillRect(view, left, 0, width * (i + 1) / NB_BARS - left, height, BARS[i]);
    }
}

bool PatternPictures::next() {
    if (_nextUnit >= _nbPictures) return false;
    ++_nextUnit;
    ++_nbDecoded;
    return true;
}

void PatternPictures::copy(void* unit) {
    auto* header = static_cast<UnitHeader*>(unit);
    header->seconds = static_cast<double>(getUnit()) / _format.rate.toDouble();
    header->nbSamples = 0;
    auto* pixels = reinterpret_cast<std::uint8_t*>(getUnitData(unit));
    std::memcpy(pixels, _bars.data(), _bars.size());

    const RgbView view{pixels, _format.width, _format.height};
    const Orv::LiString text = _timecode->getTimecode(getUnit());
    const int scale = std::max(1, _format.width / 160);
    const int textWidth = getTextWidth(text.getText(), scale);
    const int left = (_format.width - textWidth) / 2;
    const int top = _format.height * 3 / 4;
    fillRect(view, left - 2 * scale, top - 2 * scale, textWidth + 3 * scale, 11 * scale, BLACK);
    drawText(view, left, top, scale, text.getText(), WHITE);
    const int markWidth = std::max(2, _format.width / 64);
    const int way = std::max(1, _format.width - markWidth);
    const int perSecond = std::max(1, static_cast<int>(_format.rate.toDouble() + 0.5));
    fillRect(view, static_cast<int>(getUnit() % perSecond * way / perSecond), _format.height / 2,
             markWidth, markWidth, WHITE);
}

ToneSound::ToneSound(int rate, double hertz, std::int64_t nbSamples)
    : _format{rate, 2}, _hertz(hertz), _nbSamples(nbSamples) {}

std::optional<std::int64_t> ToneSound::getNbUnits() const {
    return (_nbSamples + BLOCK_SAMPLES - 1) / BLOCK_SAMPLES;
}

bool ToneSound::next() {
    if (_nextUnit >= *getNbUnits()) return false;
    ++_nextUnit;
    ++_nbDecoded;
    return true;
}

void ToneSound::copy(void* unit) {
    const std::int64_t first = getUnit() * BLOCK_SAMPLES;
    const std::int64_t nbSamples = std::min<std::int64_t>(BLOCK_SAMPLES, _nbSamples - first);
    auto* header = static_cast<UnitHeader*>(unit);
    header->seconds = static_cast<double>(first) / _format.rate;
    header->nbSamples = static_cast<std::int32_t>(nbSamples);
    auto* samples = reinterpret_cast<float*>(getUnitData(unit));
    for (std::int64_t i = 0; i < nbSamples; ++i) {
        // The phase within its second keeps its digits however long the tone is.
        const std::int64_t inSecond = (first + i) % _format.rate;
        const double cycles =
            static_cast<double>(inSecond) * _hertz / _format.rate +
            static_cast<double>((first + i) / _format.rate) * std::fmod(_hertz, 1);
        const bool isClick = inSecond < _format.rate / 1000;
        const auto value = static_cast<float>(
            isClick ? 0.9 : 0.25 * std::sin(2 * std::numbers::pi * (cycles - std::floor(cycles))));
        samples[2 * i] = value;
        samples[2 * i + 1] = value;
    }
}

}  // namespace MediaHost
