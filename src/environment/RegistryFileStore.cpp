// The settings store kept in a registry-export file.
//
// Reads take the file as it is at that moment (it is read again only when it changed) and
// never lock: a writer replaces the whole file in one rename, so a reader sees the old or the
// new version, never a mix. Each change is made under the folder's lock on the file as it is
// then (not on what this process read earlier), so two processes changing one store both
// land their changes.

#include <cstring>
#include <map>
#include <memory>
#include <mutex>

#include "environment/RegistryFile.h"
#include "environment/RegistryStore.h"
#include "environment/StoreFile.h"

namespace vtr::RegistryStore {
namespace {

using RegistryFile::Document;
using RegistryFile::KeyPath;
namespace Code = StatusCode;

// Access rights that ask for changes: set value, create subkey, delete.
constexpr uint32_t kChangeRights = 0x0002 | 0x0004 | 0x10000;

class FileStore final : public Backend {
  public:
    explicit FileStore(std::string path) : path_(std::move(path)) {}

    std::optional<std::string> File() const override { return path_; }

    Status OpenKey(KeyHandle parent, const std::string& subKey, uint32_t access,
                   KeyHandle& result) override {
        std::lock_guard lock(mutex_);
        KeyPath path;
        bool unreadable = false;
        if (Status status = Resolve(parent, subKey, path, unreadable))
            return status;
        const std::shared_ptr<const Document> document = Snapshot();
        if (unreadable || !document->Understood()) {
            // Whether the key exists cannot be told. A key opened for changes is handed out
            // so that the change itself is what gets refused, with its own failure.
            if ((access & kChangeRights) == 0)
                return Code::BadDatabase;
            result = NewHandle(std::move(path), true);
            return Code::Success;
        }
        if (document->FindKey(path) == nullptr)
            return Code::FileNotFound;
        result = NewHandle(std::move(path), false);
        return Code::Success;
    }

    Status CreateKey(KeyHandle parent, const std::string& subKey, KeyHandle& result) override {
        std::lock_guard lock(mutex_);
        KeyPath path;
        bool unreadable = false;
        if (Status status = Resolve(parent, subKey, path, unreadable))
            return status;
        if (Status status = Change([&](Document& d) { return d.CreateKey(path); })) {
            return status;
        }
        result = NewHandle(std::move(path), false);
        return Code::Success;
    }

    Status CloseKey(KeyHandle key) override {
        std::lock_guard lock(mutex_);
        if (key == LibRegistry::kCurrentUser)
            return Code::Success;
        return handles_.erase(key) != 0 ? Code::Success : Code::InvalidHandle;
    }

    Status QueryValue(KeyHandle key, const std::string& valueName, uint32_t* type, uint8_t* data,
                      uint32_t* size) override {
        std::lock_guard lock(mutex_);
        const RegistryFile::Key* found = nullptr;
        std::shared_ptr<const Document> document;
        if (Status status = FindOpenKey(key, document, found))
            return status;
        auto value = found->values.find(RegistryFile::Fold(valueName));
        if (value == found->values.end())
            return Code::FileNotFound;
        const RegistryFile::Value& stored = value->second.value;
        if (stored.opaque)
            return Code::UnsupportedType;
        const auto length = static_cast<uint32_t>(stored.data.size());
        if (data != nullptr) {
            if (size == nullptr)
                return Code::InvalidParameter;
            if (*size < length) {
                *size = length;
                return Code::MoreData;
            }
            std::memcpy(data, stored.data.data(), length);
        }
        if (type != nullptr)
            *type = stored.type;
        if (size != nullptr)
            *size = length;
        return Code::Success;
    }

    Status SetDwordValue(KeyHandle key, const std::string& valueName, uint32_t value) override {
        return SetValue(key, valueName, RegistryFile::Value::Dword(value));
    }

    Status SetStringValue(KeyHandle key, const std::string& valueName,
                          const std::string& value) override {
        return SetValue(key, valueName, RegistryFile::Value::String(value));
    }

    Status QuerySubkeyCount(KeyHandle key, uint32_t& count) override {
        std::lock_guard lock(mutex_);
        const RegistryFile::Key* found = nullptr;
        std::shared_ptr<const Document> document;
        if (Status status = FindOpenKey(key, document, found))
            return status;
        count = static_cast<uint32_t>(found->subkeys.size());
        return Code::Success;
    }

    Status EnumSubkey(KeyHandle key, uint32_t index, char* name, uint32_t* nameChars) override {
        std::lock_guard lock(mutex_);
        const RegistryFile::Key* found = nullptr;
        std::shared_ptr<const Document> document;
        if (Status status = FindOpenKey(key, document, found))
            return status;
        if (name == nullptr || nameChars == nullptr)
            return Code::InvalidParameter;
        if (index >= found->subkeys.size())
            return Code::NoMoreItems;
        const std::string& subkey = std::next(found->subkeys.begin(), index)->second.name;
        if (subkey.size() + 1 > *nameChars)
            return Code::MoreData;
        std::memcpy(name, subkey.c_str(), subkey.size() + 1);
        *nameChars = static_cast<uint32_t>(subkey.size());
        return Code::Success;
    }

    Status DeleteSubkey(KeyHandle key, const std::string& subKey) override {
        std::lock_guard lock(mutex_);
        KeyPath path;
        bool unreadable = false;
        if (RegistryFile::SplitKeyPath(subKey).empty())
            return Code::AccessDenied;
        if (Status status = Resolve(key, subKey, path, unreadable))
            return status;
        return Change([&](Document& d) { return d.DeleteKey(path); });
    }

  private:
    struct OpenKeyEntry {
        KeyPath path;
        bool unreadableStore = false;  // opened while the store could not be read
    };

    KeyHandle NewHandle(KeyPath path, bool unreadableStore) {
        const KeyHandle handle = nextHandle_;
        nextHandle_ += 4;
        handles_[handle] = OpenKeyEntry{std::move(path), unreadableStore};
        return handle;
    }

    // The path of the open key (the root included), followed by the names of subKey.
    Status Resolve(KeyHandle key, const std::string& subKey, KeyPath& path,
                   bool& unreadableStore) const {
        path.clear();
        unreadableStore = false;
        if (key != LibRegistry::kCurrentUser) {
            auto entry = handles_.find(key);
            if (entry == handles_.end())
                return Code::InvalidHandle;
            path = entry->second.path;
            unreadableStore = entry->second.unreadableStore;
        }
        const KeyPath names = RegistryFile::SplitKeyPath(subKey);
        path.insert(path.end(), names.begin(), names.end());
        return Code::Success;
    }

    // The open key as the store holds it now.
    Status FindOpenKey(KeyHandle key, std::shared_ptr<const Document>& document,
                       const RegistryFile::Key*& found) {
        KeyPath path;
        bool unreadable = false;
        if (Status status = Resolve(key, {}, path, unreadable))
            return status;
        document = Snapshot();
        if (unreadable || !document->Understood())
            return Code::BadDatabase;
        found = document->FindKey(path);
        return found != nullptr ? Code::Success : Code::KeyDeleted;
    }

    // The store as the file holds it now, read again only when the file changed.
    std::shared_ptr<const Document> Snapshot() {
        const std::optional<StoreFile::Stamp> stamp = StoreFile::StampOf(path_);
        if (!stamp)
            return Unreadable();
        if (cached_ && *stamp == cachedStamp_)
            return cached_;
        std::string bytes;
        StoreFile::Stamp readStamp;
        switch (StoreFile::ReadAll(path_, bytes, readStamp)) {
            case StoreFile::ReadOutcome::Read:
                Remember(std::make_shared<const Document>(Document::Parse(bytes)), readStamp);
                break;
            case StoreFile::ReadOutcome::Missing:
                Remember(std::make_shared<const Document>(Document::Parse({})), StoreFile::Stamp{});
                break;
            case StoreFile::ReadOutcome::Failed:
                return Unreadable();
        }
        return cached_;
    }

    static std::shared_ptr<const Document> Unreadable() {
        static const auto unreadable = std::make_shared<const Document>(Document::Unreadable());
        return unreadable;
    }

    void Remember(std::shared_ptr<const Document> document, const StoreFile::Stamp& stamp) {
        cached_ = std::move(document);
        cachedStamp_ = stamp;
    }

    Status SetValue(KeyHandle key, const std::string& valueName, const RegistryFile::Value& value) {
        std::lock_guard lock(mutex_);
        KeyPath path;
        bool unreadable = false;
        if (Status status = Resolve(key, {}, path, unreadable))
            return status;
        return Change([&](Document& d) { return d.SetValue(path, valueName, value); });
    }

    // Read, change, write back, all under the folder's lock, on the file as it is now.
    template <typename Edit>
    Status Change(Edit&& edit) {
        const std::string target = StoreFile::WriteTarget(path_);
        StoreFile::FolderLock folderLock(target);
        if (!folderLock.Held())
            return Code::AccessDenied;
        std::string bytes;
        StoreFile::Stamp stamp;
        Document document = Document::Unreadable();
        switch (StoreFile::ReadAll(target, bytes, stamp)) {
            case StoreFile::ReadOutcome::Read:
                document = Document::Parse(bytes);
                break;
            case StoreFile::ReadOutcome::Missing:
                document = Document::Parse({});
                break;
            case StoreFile::ReadOutcome::Failed:
                return Code::BadDatabase;
        }
        // A store that cannot be understood is never overwritten.
        if (!document.Understood())
            return Code::BadDatabase;
        if (Status status = edit(document))
            return status;
        if (!document.Modified())
            return Code::Success;
        const std::optional<std::string> text = document.Serialize();
        if (!text)
            return Code::InvalidData;
        if (!StoreFile::Replace(target, *text))
            return Code::WriteFault;
        if (const std::optional<StoreFile::Stamp> written = StoreFile::StampOf(path_)) {
            Remember(std::make_shared<const Document>(std::move(document)), *written);
        }
        return Code::Success;
    }

    std::mutex mutex_;
    const std::string path_;
    std::map<KeyHandle, OpenKeyEntry> handles_;
    KeyHandle nextHandle_ = 0x1000;
    std::shared_ptr<const Document> cached_;
    StoreFile::Stamp cachedStamp_;
};

}  // namespace

std::unique_ptr<Backend> OpenFileStore(const std::string& path) {
    return std::make_unique<FileStore>(path);
}

}  // namespace vtr::RegistryStore
