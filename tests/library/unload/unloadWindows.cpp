// Loads both libraries, lets go of them, and sees whether they stay.
#include <cstdio>
#include <windows.h>

int main(int argc, char** argv) {
    int nbGone = argc == 3 ? 0 : 1;
    for (int i = 1; i < argc; ++i) {
        HMODULE library = ::LoadLibraryA(argv[i]);
        if (library == nullptr || !::FreeLibrary(library)) {
            std::printf("%s: error %lu\n", argv[i], ::GetLastError());
            return 2;
        }
        const bool stays = ::GetModuleHandleA(argv[i]) == library;
        std::printf("%s %s\n", argv[i], stays ? "stays" : "IS GONE");
        if (!stays) ++nbGone;
    }
    return nbGone;
}
