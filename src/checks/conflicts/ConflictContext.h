#pragma once

#include <string>

namespace vtr {

// What a conflict within one sequence says of an intensity file: its kind ("Gridcraft
// Intensity File", "Novalux Intensity File"; not the file's own name) and the text of the
// track that carries it.
class ConflictContext {
  public:
    const std::string& BlobberName() const { return blobberName_; }
    void SetBlobberName(std::string name) { blobberName_ = std::move(name); }
    const std::string& TrackName() const { return trackName_; }
    void SetTrackName(std::string name) { trackName_ = std::move(name); }

  private:
    std::string blobberName_;
    std::string trackName_;
};

}  // namespace vtr
