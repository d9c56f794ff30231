#pragma once

#include <memory>
#include <orv/devMDStreamElem.h>
#include <orv/mbBufferRdGuardImp.h>
#include <utility>
#include <vector>

#include "formats.h"

namespace MediaHost {

/// A picture on its way: locked in memory as long as anybody holds it.
class PictureBuf : public Orv::DevMDStreamBuf {
public:
    PictureBuf(Orv::MbBufferRdGuardImp guard, std::shared_ptr<const PictureFormat> format,
               std::int64_t number)
        : _guard(std::move(guard)), _format(std::move(format)), _number(number) {}

    const PictureFormat& getFormat() const { return *_format; }
    std::int64_t getNumber() const { return _number; }  ///< In its track.
    const std::byte* getData() const { return getUnitData(_guard.getMemory()); }

private:
    const Orv::MbBufferRdGuardImp _guard;
    const std::shared_ptr<const PictureFormat> _format;
    const std::int64_t _number;
};

/// A piece of sound on its way.
class SoundBuf : public Orv::DevMDStreamBuf {
public:
    SoundBuf(const SoundFormat& format, std::vector<float> samples)
        : _format(format), _samples(std::move(samples)) {}

    const SoundFormat& getFormat() const { return _format; }
    const std::vector<float>& getSamples() const { return _samples; }
    std::size_t getNbSamples() const {
        return _samples.size() / static_cast<std::size_t>(_format.nbChannels);
    }

private:
    const SoundFormat _format;
    const std::vector<float> _samples;
};

inline Orv::ObjPtr<Orv::DevMDStreamElem> createElem(Orv::RCShdPtr<Orv::DevMDStreamBuf> buf) {
    return Orv::ObjPtr<Orv::DevMDStreamElem>(
        new Orv::DevMDStreamElem(std::move(buf), Orv::DevMDStreamElem::DATA));
}
inline Orv::ObjPtr<Orv::DevMDStreamElem> createNews(Orv::DevMDStreamElem::Ev ev) {
    return Orv::ObjPtr<Orv::DevMDStreamElem>(new Orv::DevMDStreamElem(nullptr, ev));
}

}  // namespace MediaHost
