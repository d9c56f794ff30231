// A device in seventy lines: a mixer with a gain, a peak meter, an input that others push sound into,
// and an output that pushes a test tone.
#pragma once

#include <algorithm>
#include <cmath>
#include <orv/devMDStdDevice.h>
#include <stdexcept>
#include <vector>

/// A block of samples that travels through streams.
class SoundBuf : public Orv::DevMDStreamBuf {
public:
    explicit SoundBuf(std::vector<float> values) : samples(std::move(values)) {}
    const std::vector<float> samples;
};

class Mixer : public Orv::DevMDStdDevice {
public:
    static constexpr unsigned PEAK_ROSE = 1;  // what the meter's observers are told

    explicit Mixer(const Orv::LiString& name) : DevMDStdDevice(name) {
        auto decibels = Orv::DevMDPropertyDescriptor<double>::create();
        decibels->setUnit("dB").setRange(-60, 12).setStep(0.5).setDefault(0);

        // Getters and setters run on the mixer's own thread, so _gain and _peak need no lock.
        addProperty<double>(
            "channel1:gain", "amplification", [this] { return _gain; },
            [this](double gain) { _gain = gain; }, decibels);
        _meter = addProperty<double>("meter:peak", "loudest sample", [this] { return _peak; });

        addProperty<int>(
            "scene", "recalled last", [this] { return _scene; },
            [this](int scene) {
                if (scene > 3) throw std::out_of_range("there are three scenes");
                _scene = scene;
            });

        addSink("input", "audio/pcm", [this](Orv::ObjPtr<Orv::DevMDStreamElem> elem) {
            if (elem->getEv() == Orv::DevMDStreamElem::DATA) measure(*elem);
        });
        addLoopSource("tone", "audio/pcm;rate=48000", &Mixer::playTone);
    }

private:
    double _gain = 0;
    double _peak = 0;
    int _scene = 1;
    Orv::RCShdPtr<Orv::DevMDStdProperty<double>> _meter;

    void open() override { _peak = 0; }  // on the mixer's thread; what it throws, opening throws

    void measure(const Orv::DevMDStreamElem& elem) {
        const auto& buf = dynamic_cast<const SoundBuf&>(*elem.getBuf());
        const double factor = std::pow(10, _gain / 20);
        const double before = _peak;
        for (const float sample : buf.samples) _peak = std::max(_peak, factor * std::abs(sample));
        if (_peak > before) _meter->notify(PEAK_ROSE);
    }

    // On a thread of its own, while the tone is connected to something.
    static void playTone(Orv::DevMDStdStreamLoopSource& tone) {
        for (int block = 1; block <= 10; ++block) {
            const std::vector<float> samples(480, 0.05F * static_cast<float>(block));
            Orv::RCShdPtr<Orv::DevMDStreamBuf> buf(new SoundBuf(samples));
            Orv::ObjPtr<Orv::DevMDStreamElem> elem(
                new Orv::DevMDStreamElem(buf, Orv::DevMDStreamElem::DATA));
            if (!tone.push(std::move(elem))) return;
        }
    }
};
