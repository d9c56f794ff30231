// A program that uses the base library alone.
#include <orv/base.h>

int main() {
    try {
        Orv::ObjPtr<int> nothing;
        return *nothing;
    } catch (const Orv::RCEx&) {
        return 0;
    }
}
