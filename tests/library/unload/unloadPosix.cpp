// Loads both libraries, lets go of them, and sees whether they stay.
#include <cstdio>
#include <dlfcn.h>

int main(int argc, char** argv) {
    int nbGone = argc == 3 ? 0 : 1;
    for (int i = 1; i < argc; ++i) {
        void* const library = dlopen(argv[i], RTLD_NOW);
        if (library == nullptr || dlclose(library) != 0) {
            std::printf("%s\n", dlerror());
            return 2;
        }
        const bool stays = dlopen(argv[i], RTLD_NOW | RTLD_NOLOAD) != nullptr;
        std::printf("%s %s\n", argv[i], stays ? "stays" : "IS GONE");
        if (!stays) ++nbGone;
    }
    return nbGone;
}
