#pragma once

#include <optional>
#include <string>

// Which settings store the process uses, chosen once at start-up:
//   - the file named by --registry (Select with a path);
//   - else the VANTORI_REGISTRY environment variable;
//   - else, on Windows, the real registry, and elsewhere the per-user
//     $XDG_CONFIG_HOME/vantori/registry.reg (~/.config when unset).
namespace vtr::RegistryStore {

void Select(const std::optional<std::string>& fileOption);

// The file in use, or nothing when the real registry is.
std::optional<std::string> CurrentFile();

}  // namespace vtr::RegistryStore
