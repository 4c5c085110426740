// Makes the demo installation from its sources:
//   vtr-demo-instantiate SOURCE_FOLDER TARGET_FOLDER [--today yyyy-mm-dd]
// The calendar dates of the instance are counted from --today, else from the current date.
#include <exception>
#include <iostream>
#include <optional>
#include <string>

#include "DemoInstance.h"
#include "schedule/DateTime.h"
#include "vtrsupport/PeImage.h"

int main(int argc, char** argv) {
    const std::string usage =
        "usage: vtr-demo-instantiate SOURCE_FOLDER TARGET_FOLDER [--today yyyy-mm-dd]";
    if (argc != 3 && argc != 5) {
        std::cerr << usage << "\n";
        return 64;
    }
    vtr::demo::InstanceOptions options;
    options.today = vtr::DateTime::Today();
    if (argc == 5) {
        const std::optional<vtr::DateTime> today = vtr::DateTime::Parse(argv[4]);
        if (std::string(argv[3]) != "--today" || !today) {
            std::cerr << usage << "\n";
            return 64;
        }
        options.today = today->Date();
    }
    options.writeAppFile = [](const std::string& path, const std::string& version) {
        vtr::testsupport::WritePeImage(path, version);
    };
    try {
        vtr::demo::Instantiate(argv[1], argv[2], options);
    } catch (const std::exception& error) {
        std::cerr << "vtr-demo-instantiate: " << error.what() << "\n";
        return 1;
    }
    return 0;
}
