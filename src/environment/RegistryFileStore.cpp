// The settings store kept in a registry-export file.
//
// Reads take the file as it is at that moment (it is read again only when it changed) and
// never lock: a writer replaces the whole file in one rename, so a reader sees the old or the
// new version, never a mix. Changes are made under the store's lock on the file as it is
// then (not on what this process read earlier) and written back in one replacement, so two
// processes changing one store both land their changes. A group of changes (Changes) holds
// the lock and writes once for all of them.

#include <cerrno>
#include <cstring>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <thread>

#include "environment/RegistryFile.h"
#include "environment/RegistryStore.h"
#include "environment/StoreFile.h"

namespace vtr::RegistryStore {
namespace {

using RegistryFile::Document;
using RegistryFile::KeyPath;
namespace Code = StatusCode;
namespace fs = std::filesystem;

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
        const std::shared_ptr<const Document> document = View();
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
        KeyPath path;
        {
            std::lock_guard lock(mutex_);
            bool unreadable = false;
            if (Status status = Resolve(parent, subKey, path, unreadable))
                return status;
        }
        if (Status status = Change([&](Document& d) { return d.CreateKey(path); }))
            return status;
        std::lock_guard lock(mutex_);
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
        auto value = found->values.find(valueName);
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
            // A value's bytes are copied as they are: their length says where they end.
            // NOLINTNEXTLINE(bugprone-not-null-terminated-result)
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
        KeyPath path;
        {
            std::lock_guard lock(mutex_);
            bool unreadable = false;
            if (RegistryFile::SplitKeyPath(subKey).empty())
                return Code::AccessDenied;
            if (Status status = Resolve(key, subKey, path, unreadable))
                return status;
        }
        return Change([&](Document& d) { return d.DeleteKey(path); });
    }

    Status BeginChanges() override {
        {
            std::lock_guard lock(mutex_);
            if (OwnsChanges()) {
                ++depth_;
                return Code::Success;
            }
        }
        // Waits for the other writers without holding up this process's readers.
        const std::string target = StoreFile::WriteTarget(path_);
        const fs::path folder = fs::path(target).parent_path();
        std::error_code made;
        if (!folder.empty() && !fs::is_directory(folder) && !fs::create_directories(folder, made)) {
            std::lock_guard lock(mutex_);
            failure_ = "the settings store " + path_ + " could not be written: its folder " +
                       folder.string() + " could not be made (" + made.message() + ")";
            return Code::PathNotFound;
        }
        if (StoreFile::IsReadOnly(target).value_or(false)) {
            std::lock_guard lock(mutex_);
            return ReadOnly();
        }
        auto storeLock = std::make_unique<StoreFile::Lock>(target, StoreFile::Lock::On::StoreFile);
        std::lock_guard lock(mutex_);
        if (!storeLock->Held()) {
            failure_ = "the settings store " + path_ + " could not be locked for writing (" +
                       StoreFile::ErrorText(storeLock->Error()) + ")";
            return Code::AccessDenied;
        }
        if (StoreFile::IsReadOnly(target).value_or(false))
            return ReadOnly();
        std::string problem;
        std::shared_ptr<Document> document = Fresh(target, problem);
        if (!document) {
            failure_ = "the settings store " + path_ + " could not be read (" + problem + ")";
            return Code::BadDatabase;
        }
        // A store that cannot be understood is never overwritten.
        if (!document->Understood()) {
            failure_ = "the settings store " + path_ +
                       " is not a registry export (its first line is neither \"Windows "
                       "Registry Editor Version 5.00\" nor \"REGEDIT4\"); it was left as it is";
            return Code::BadDatabase;
        }
        document->BeginBatch();
        pending_ = std::move(document);
        target_ = target;
        lock_ = std::move(storeLock);
        owner_ = std::this_thread::get_id();
        depth_ = 1;
        return Code::Success;
    }

    Status CommitChanges() override {
        std::lock_guard lock(mutex_);
        if (!OwnsChanges())
            return Code::InvalidHandle;
        if (--depth_ > 0)
            return Code::Success;
        const Status status = Write();
        EndChanges();
        return status;
    }

    void AbortChanges() override {
        std::lock_guard lock(mutex_);
        if (OwnsChanges())
            EndChanges();
    }

    void BeginReading() override {
        std::lock_guard lock(mutex_);
        ++readers_[std::this_thread::get_id()].depth;
    }

    void EndReading() override {
        std::lock_guard lock(mutex_);
        auto reader = readers_.find(std::this_thread::get_id());
        if (reader != readers_.end() && --reader->second.depth <= 0)
            readers_.erase(reader);
    }

    Condition Examine() override {
        std::lock_guard lock(mutex_);
        Condition condition;
        const std::optional<StoreFile::Stamp> stamp = StoreFile::StampOf(path_);
        condition.exists = !stamp || stamp->exists;
        const std::shared_ptr<const Document> document = Snapshot();
        condition.understood = document->Understood();
        if (!condition.understood)
            condition.problem = readProblem_;
        condition.readOnly = StoreFile::IsReadOnly(StoreFile::WriteTarget(path_)).value_or(false);
        return condition;
    }

    std::string Failure() const override {
        std::lock_guard lock(mutex_);
        return failure_;
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

    // The open key as the calling thread sees the store.
    Status FindOpenKey(KeyHandle key, std::shared_ptr<const Document>& document,
                       const RegistryFile::Key*& found) {
        static const OpenKeyEntry root;
        const OpenKeyEntry* entry = &root;
        if (key != LibRegistry::kCurrentUser) {
            auto open = handles_.find(key);
            if (open == handles_.end())
                return Code::InvalidHandle;
            entry = &open->second;
        }
        document = View();
        if (entry->unreadableStore || !document->Understood())
            return Code::BadDatabase;
        found = document->FindKey(entry->path);
        return found != nullptr ? Code::Success : Code::KeyDeleted;
    }

    // A store file whose own permissions forbid writing it is left as it is.
    Status ReadOnly() {
        failure_ = "the settings store is read-only: " + path_ +
                   " (its permissions do not allow writing; it was left as it is)";
        return Code::WriteProtect;
    }

    bool OwnsChanges() const { return depth_ > 0 && owner_ == std::this_thread::get_id(); }

    // The store as the calling thread sees it: with its own changes while it makes them;
    // inside a ReadScope as last seen; otherwise as the file holds it now.
    std::shared_ptr<const Document> View() {
        if (OwnsChanges())
            return pending_;
        auto reader = readers_.find(std::this_thread::get_id());
        if (reader != readers_.end()) {
            if (reader->second.looked && cached_)
                return cached_;
            reader->second.looked = true;
        }
        return Snapshot();
    }

    // The store as the file holds it now, read again only when the file changed.
    std::shared_ptr<const Document> Snapshot() {
        const std::optional<StoreFile::Stamp> stamp = StoreFile::StampOf(path_);
        if (!stamp) {
            readProblem_ = "it cannot be examined";
            return Unreadable();
        }
        if (cached_ && *stamp == cachedStamp_)
            return cached_;
        cached_.reset();  // one version in memory at a time
        std::string bytes;
        StoreFile::Stamp readStamp;
        errno = 0;
        switch (StoreFile::ReadAll(path_, bytes, readStamp)) {
            case StoreFile::ReadOutcome::Read:
                Remember(std::make_shared<Document>(Document::Parse(std::move(bytes))), readStamp);
                break;
            case StoreFile::ReadOutcome::Missing:
                Remember(std::make_shared<Document>(Document::Parse(std::string())),
                         StoreFile::Stamp{});
                break;
            case StoreFile::ReadOutcome::Failed:
                readProblem_ = ReadFailure();
                return Unreadable();
        }
        if (!cached_->Understood())
            readProblem_ =
                "its first line is neither \"Windows Registry Editor Version 5.00\" "
                "nor \"REGEDIT4\"";
        return cached_;
    }

    static std::shared_ptr<const Document> Unreadable() {
        static const auto unreadable = std::make_shared<const Document>(Document::Unreadable());
        return unreadable;
    }

    static std::string ReadFailure() {
        const int error = errno;
        return error != 0 ? StoreFile::ErrorText(error) : std::string("it is not a file");
    }

    void Remember(std::shared_ptr<Document> document, const StoreFile::Stamp& stamp) {
        cached_ = std::move(document);
        cachedStamp_ = stamp;
    }

    // The store as the file holds it, for changing, under the lock: the version this process
    // already holds when the file has not changed since (it is then no longer kept as the
    // readers' version, which must not see changes before they are written), else read anew.
    // Null (and problem) when the file cannot be read.
    std::shared_ptr<Document> Fresh(const std::string& target, std::string& problem) {
        const std::optional<StoreFile::Stamp> stamp = StoreFile::StampOf(target);
        if (stamp && cached_ && *stamp == cachedStamp_) {
            std::shared_ptr<Document> document = cached_.use_count() == 1
                                                     ? std::move(cached_)
                                                     : std::make_shared<Document>(*cached_);
            cached_.reset();
            document->Saved();
            return document;
        }
        cached_.reset();
        std::string bytes;
        StoreFile::Stamp readStamp;
        errno = 0;
        switch (StoreFile::ReadAll(target, bytes, readStamp)) {
            case StoreFile::ReadOutcome::Read:
                return std::make_shared<Document>(Document::Parse(std::move(bytes)));
            case StoreFile::ReadOutcome::Missing:
                return std::make_shared<Document>(Document::Parse(std::string()));
            case StoreFile::ReadOutcome::Failed:
                break;
        }
        problem = ReadFailure();
        return nullptr;
    }

    // The changes of the group, checked and written in one replacement of the file.
    Status Write() {
        if (const Status status = pending_->EndBatch()) {
            failure_ = "the change could not be written to the settings store " + path_ +
                       " so that it reads back exactly; the store was left as it was";
            return status;
        }
        if (!pending_->Modified())
            return Code::Success;
        const std::optional<std::string> bytes = pending_->Serialize();
        if (!bytes) {
            failure_ = "the change cannot be written in the encoding of the settings store " +
                       path_ + "; the store was left as it was";
            return Code::InvalidData;
        }
        int error = 0;
        if (!StoreFile::Replace(target_, *bytes, &error)) {
            failure_ = "the settings store " + path_ + " could not be written (" +
                       StoreFile::ErrorText(error) + "); it was left as it was";
            return Code::WriteFault;
        }
        pending_->Saved();
        if (const std::optional<StoreFile::Stamp> written = StoreFile::StampOf(path_))
            Remember(std::move(pending_), *written);
        return Code::Success;
    }

    void EndChanges() {
        pending_.reset();
        lock_.reset();
        depth_ = 0;
        target_.clear();
    }

    Status SetValue(KeyHandle key, const std::string& valueName, const RegistryFile::Value& value) {
        KeyPath path;
        {
            std::lock_guard lock(mutex_);
            bool unreadable = false;
            if (Status status = Resolve(key, {}, path, unreadable))
                return status;
        }
        return Change([&](Document& d) { return d.SetValue(path, valueName, value); });
    }

    // One change: part of the calling thread's group of changes, or a group of its own.
    template <typename Edit>
    Status Change(Edit&& edit) {
        bool own;
        {
            std::lock_guard lock(mutex_);
            own = !OwnsChanges();
        }
        if (own) {
            if (Status status = BeginChanges())
                return status;
        }
        Status status;
        {
            std::lock_guard lock(mutex_);
            status = edit(*pending_);
        }
        if (!own)
            return status;
        if (status != Code::Success) {
            AbortChanges();
            return status;
        }
        return CommitChanges();
    }

    mutable std::mutex mutex_;
    const std::string path_;
    std::map<KeyHandle, OpenKeyEntry> handles_;
    KeyHandle nextHandle_ = 0x1000;
    std::shared_ptr<Document> cached_;  // the readers' version of the store
    StoreFile::Stamp cachedStamp_;
    std::string readProblem_;  // why the file could not be read, when it could not
    struct Reader {
        int depth = 0;
        bool looked = false;  // the file was examined since the scope began
    };
    std::map<std::thread::id, Reader> readers_;  // threads inside a ReadScope
    std::string failure_;

    // The group of changes in progress.
    std::thread::id owner_;
    int depth_ = 0;
    std::unique_ptr<StoreFile::Lock> lock_;
    std::shared_ptr<Document> pending_;
    std::string target_;
};

}  // namespace

std::unique_ptr<Backend> OpenFileStore(const std::string& path) {
    return std::make_unique<FileStore>(path);
}

}  // namespace vtr::RegistryStore
