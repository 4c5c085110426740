#pragma once

#include <cstddef>
#include <cstdint>
#include <string>

// Small, well-formed Windows PE images for tests and demo installations: a library with
// one resource section that holds a version resource (or, without a version, a manifest
// resource only). The bytes are the same on every platform, and the system's own version
// service on Windows reads them as our reader does.
//
//   vtr::testsupport::WritePeImage(folder + "SuiteCommon.dll", "1.0.0.0");
//   vtr::testsupport::WritePeImage(folder + "Plain.exe");         // no version resource
namespace vtr::testsupport {

// Writes the image as the whole file (replacing it). `version` is "a.b.c.d" with each part
// 0..65535, or "" for an image without version information. Throws std::invalid_argument
// for any other version text and std::runtime_error when the file cannot be written.
void WritePeImage(const std::string& fileName, const std::string& version = "");

// How an image is laid out, for tests of readers on unusual or damaged images.
struct PeImageOptions {
    std::string version;            // as for WritePeImage
    bool pe32Plus = false;          // a 64-bit optional header
    bool codeSectionFirst = false;  // a ".text" section before the resources
    uint32_t fixedInfoSignature = 0xFEEF04BDu;
};

// Where the parts of an image lie (file offsets), so a test can damage one on purpose.
struct PeImageLayout {
    std::size_t peHeader = 0;                // "PE\0\0"
    std::size_t optionalHeader = 0;          // its magic number
    std::size_t resourceDirectoryEntry = 0;  // the resource data directory (address, size)
    std::size_t sectionTable = 0;
    std::size_t resourceSection = 0;  // the root resource directory
    std::size_t dataEntry = 0;        // the version resource's data entry (0 without one)
    std::size_t versionInfo = 0;      // VS_VERSIONINFO (0 without one)
    std::size_t fixedInfo = 0;        // its fixed block, at the signature (0 without one)
};

// The image's bytes; the layout is filled in when asked for.
std::string PeImageBytes(const std::string& version = "");
std::string PeImageBytes(const PeImageOptions& options, PeImageLayout* layout = nullptr);

}  // namespace vtr::testsupport
