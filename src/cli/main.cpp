#include <cstdio>
#include <iostream>

#include "App.h"
#include "Interrupt.h"
#include "Terminal.h"
#include "engine/AllocatorSettings.h"

int main(int argc, char** argv) {
    vtr::SettleAllocator();
    vtr::cli::InstallLastResortCleanUp();
    vtr::cli::Console console{std::cout, std::cerr, vtr::cli::IsTerminal(stderr),
                              vtr::cli::TerminalColumns(stderr)};
    console.outIsColorTerminal =
        vtr::cli::IsTerminal(stdout) && vtr::cli::EnableColorEscapes(stdout);
    return vtr::cli::Main(argc, argv, console);
}
