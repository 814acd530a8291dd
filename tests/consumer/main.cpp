// An application that embeds KelText through its installed CMake package.
#include <cstdio>

#include "keltext/library/catalogue.h"

int main() {
    kel::Catalogue catalogue;
    for (const char* name : {"KelAlphaNumeric", "KelNumeric", "KelDateMask", "KelCombo", "pagCombo"}) {
        if (!catalogue.find(name)) {
            std::printf("missing class %s\n", name);
            return 1;
        }
    }
    std::printf("%zu classes\n", catalogue.classes().size());
    return 0;
}
