#include <cstdlib>
#include <gtest/gtest.h>
#include <new>

#include "liString.h"

// The linker leads the strings' calls of the C allocator here (see tests/CMakeLists.txt), so that
// any of them can be made to fail.

namespace {

thread_local int nbAllocationsLeft = -1;  // negative: without limit

bool mayAllocate() {
    if (nbAllocationsLeft == 0) return false;
    if (nbAllocationsLeft > 0) --nbAllocationsLeft;
    return true;
}

}  // namespace

extern "C" {
void* __real_malloc(std::size_t size);
void* __real_realloc(void* memory, std::size_t size);
void* __wrap_malloc(std::size_t size) {
    return mayAllocate() ? __real_malloc(size) : nullptr;
}
void* __wrap_realloc(void* memory, std::size_t size) {
    return mayAllocate() ? __real_realloc(memory, size) : nullptr;
}
}

namespace Orv {

namespace {

TEST(LiString, anAllocationThatFailsLeavesTheStringAsItWas) {
    const struct {
        const char* label;
        std::function<void(LiString&)> change;
        int nbAllocations;  // of a short string that is not shared
    } rows[] = {
        {"assign", [](LiString& s) { s = "other"; }, 1},
        {"assign a long text", [](LiString& s) { s = std::string(600, 'x').c_str(); }, 2},
        {"append", [](LiString& s) { s += std::string(600, 'x').c_str(); }, 1},
        {"append itself",
         [](LiString& s) {
             for (int i = 0; i < 8; ++i) s += s;
         },
         0},
        {"append characters",
         [](LiString& s) {
             for (int i = 0; i < 600; ++i) s += 'x';
         },
         0},
        {"join", [](LiString& s) { s = s + "x"; }, 1},
        {"cut", [](LiString& s) { s = LiString(s, 1, 2); }, 1},
        {"release", [](LiString& s) { ArrayPtr<char> chars = s.releaseChars(); }, 1},
        {"read",
         [](LiString& s) {
             std::istringstream stream(std::string(600, 'w'));
             stream >> s;
         },
         0},
    };
    for (const auto& row : rows) {
        for (const int length : {5, 700}) {
            for (const bool isShared : {false, true}) {
                SCOPED_TRACE(testing::Message()
                             << row.label << ", " << length << " characters, shared: " << isShared);
                const std::string text(static_cast<std::size_t>(length), 'a');
                for (int nbAllocations = 0;; ++nbAllocations) {
                    LiString string{std::string_view(text)};
                    const LiString sharer = isShared ? string : LiString();
                    std::string before;
                    bool hasFailed = false;
                    nbAllocationsLeft = nbAllocations;
                    try {
                        row.change(string);
                    } catch (const std::bad_alloc&) {
                        hasFailed = true;
                    }
                    nbAllocationsLeft = -1;
                    ASSERT_EQ(sharer.getText(), isShared ? text : "");
                    if (!hasFailed) {
                        if (length == 5 && !isShared && row.nbAllocations > 0) {
                            EXPECT_EQ(nbAllocations, row.nbAllocations);
                        }
                        break;
                    }
                    // Of several steps, those before the one that failed stay done.
                    ASSERT_TRUE(string.getText().starts_with(text));
                    ASSERT_EQ(std::strlen(string.getChars()), string.getText().size());
                    string += "z";
                    ASSERT_TRUE(string.getText().ends_with("z"));
                }
            }
        }
    }
}

TEST(LiString, emptyStringsAndCopiesAllocateNothing) {
    const LiString original("some text");
    nbAllocationsLeft = 0;
    LiString empty;
    LiString copy = original;
    const LiString moved(std::move(copy));
    empty = "";
    const bool isEmpty = LiString(nullptr).isEmpty() && empty.isEmpty() && copy.isEmpty();
    nbAllocationsLeft = -1;
    EXPECT_TRUE(isEmpty);
    EXPECT_EQ(moved.getChars(), original.getChars());
}

}  // namespace

}  // namespace Orv
