#pragma once

#include <memory>

#include "mediaDevice.h"
#include "pictureTools.h"
#include "settings.h"

namespace MediaHost {

class Window;

/// Shows the pictures that go through it, streams "video" and "through": in a window where there is
/// a display and the setting window=1 asks for it, and afterwards on the contact sheet
/// "contact-sheet.png": pictures from all over the show, with their timecodes.
class DisplayDevice : public MediaDevice {
public:
    DisplayDevice(const Orv::LiString& name, HostContext& context, Settings settings);
    ~DisplayDevice() noexcept(false) override;

protected:
    void open() override;
    void finish(bool isWhole) override;
    void close() override;

private:
    struct Thumbnail {
        std::int64_t number;
        std::vector<std::uint8_t> pixels;
    };
    static constexpr std::size_t NB_SHOWN = 12;
    static constexpr std::size_t NB_KEPT = 2 * NB_SHOWN;
    static constexpr int NB_COLUMNS = 4;
    static constexpr int WIDTH = 320;

    Orv::RCShdPtr<Source> _through;
    const bool _hasWindow;
    std::unique_ptr<Window> _window;  // null if there is none
    PictureScaler _scaler;
    int _height = 0;                     // of the thumbnails
    std::vector<Thumbnail> _thumbnails;  // every _stride-th picture
    std::int64_t _stride = 1;
    std::int64_t _nbPictures = 0;
    std::int64_t _number = 0;  // of the latest

    void take(const Orv::RCShdPtr<PictureBuf>& buf);
    void keep(const PictureBuf& buf);
    void drawSheet() const;
};

}  // namespace MediaHost
