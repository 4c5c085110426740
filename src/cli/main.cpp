#include <cstdio>
#include <string_view>

#include "VtrVersion.h"

int main(int argc, char** argv) {
    if (argc == 2 && std::string_view(argv[1]) == "--version") {
        std::printf("vantori-verify %s\n", vtr::kVersionText);
        return 0;
    }
    std::fprintf(stderr, "usage: vantori-verify --version\n");
    return 64;
}
