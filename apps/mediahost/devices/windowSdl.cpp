#include <SDL.h>

#include "mediaError.h"
#include "pictureTools.h"
#include "window.h"

namespace MediaHost {

namespace {

class SdlWindow : public Window {
public:
    SdlWindow() {
        // Ctrl-C is the host's own.
        SDL_SetHint(SDL_HINT_NO_SIGNAL_HANDLERS, "1");
        if (SDL_InitSubSystem(SDL_INIT_VIDEO) != 0) fail("there is no display");
    }
    ~SdlWindow() override {
        SDL_DestroyTexture(_texture);
        SDL_DestroyRenderer(_renderer);
        SDL_DestroyWindow(_window);
        SDL_QuitSubSystem(SDL_INIT_VIDEO);
    }

    void show(const PictureFormat& format, const std::byte* picture) override {
        if (_window == nullptr) open(format);
        SDL_Event event;
        while (SDL_PollEvent(&event) != 0) {
        }
        _scaler.scale(format, picture, format.width, format.height, _pixels);
        SDL_UpdateTexture(_texture, nullptr, _pixels.data(), format.width * 3);
        SDL_RenderCopy(_renderer, _texture, nullptr, nullptr);
        SDL_RenderPresent(_renderer);
    }

private:
    SDL_Window* _window = nullptr;
    SDL_Renderer* _renderer = nullptr;
    SDL_Texture* _texture = nullptr;
    PictureScaler _scaler;
    std::vector<std::uint8_t> _pixels;

    [[noreturn]] static void fail(const char* what) {
        throw MediaError(std::string(what) + ": " + SDL_GetError());
    }

    void open(const PictureFormat& format) {
        _window =
            SDL_CreateWindow("orv-mediahost", SDL_WINDOWPOS_UNDEFINED, SDL_WINDOWPOS_UNDEFINED,
                             format.width, format.height, SDL_WINDOW_RESIZABLE);
        if (_window == nullptr) fail("cannot open a window");
        _renderer = SDL_CreateRenderer(_window, -1, 0);
        if (_renderer == nullptr) fail("cannot draw into a window");
        _texture = SDL_CreateTexture(_renderer, SDL_PIXELFORMAT_RGB24, SDL_TEXTUREACCESS_STREAMING,
                                     format.width, format.height);
        if (_texture == nullptr) fail("cannot draw pictures of this size");
    }
};

}  // namespace

std::unique_ptr<Window> Window::create() {
    return std::make_unique<SdlWindow>();
}

}  // namespace MediaHost
