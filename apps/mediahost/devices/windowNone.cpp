#include "mediaError.h"
#include "window.h"

namespace MediaHost {

std::unique_ptr<Window> Window::create() {
    throw MediaError("there are no windows: this program was built without SDL");
}

}  // namespace MediaHost
