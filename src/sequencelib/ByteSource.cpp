#include "sequencelib/ByteSource.h"

#include <zlib.h>

#include <cerrno>
#include <filesystem>
#include <system_error>

#include "sequencelib/LoadFailure.h"

namespace vtr::seqlib::detail {

std::string ByteCountText(unsigned long long bytes) {
    struct Unit {
        unsigned long long size;
        const char* name;
    };
    static const Unit units[] = {{1ull << 30, " GiB"}, {1ull << 20, " MiB"}, {1ull << 10, " KiB"}};
    for (const Unit& unit : units) {
        if (bytes >= unit.size && bytes % unit.size == 0) {
            return std::to_string(bytes / unit.size) + unit.name;
        }
    }
    return std::to_string(bytes) + (bytes == 1 ? " byte" : " bytes");
}

bool IsGzipSignature(const unsigned char* data, std::size_t size) {
    return size >= 2 && data[0] == 0x1F && data[1] == 0x8B;
}

namespace {

[[noreturn]] void FailRead(int error) {
    FailLoad({}, "the file cannot be read (" + std::generic_category().message(error) + ")");
}

// The file's own bytes. The first two can be looked at before reading starts.
class FileSource final : public ByteSource {
  public:
    explicit FileSource(const std::string& path) {
        // A pipe, socket or device is no sequence file; opening a pipe would wait for a
        // writer that never comes.
        std::error_code type;
        const auto status = std::filesystem::status(path, type);
        if (!type && status.type() != std::filesystem::file_type::regular &&
            status.type() != std::filesystem::file_type::directory) {
            FailLoad({}, "the file cannot be read (it is not a regular file)");
        }
        file_ = std::fopen(path.c_str(), "rb");
        if (file_ == nullptr)
            FailRead(errno);
        std::error_code ec;
        const auto size = std::filesystem::file_size(path, ec);
        total_ = ec ? 0 : static_cast<std::uint64_t>(size);
    }
    ~FileSource() override { std::fclose(file_); }
    FileSource(const FileSource&) = delete;
    FileSource& operator=(const FileSource&) = delete;

    // Reads the first bytes ahead; Read returns them again.
    std::size_t Peek(unsigned char* buffer, std::size_t size) {
        peeked_ = ReadFile(reinterpret_cast<char*>(peek_), std::min(size, sizeof peek_));
        std::copy(peek_, peek_ + peeked_, buffer);
        return peeked_;
    }

    std::size_t Read(char* buffer, std::size_t size) override {
        std::size_t got = 0;
        if (peekPos_ < peeked_ && size > 0) {
            const std::size_t n = std::min(size, peeked_ - peekPos_);
            std::copy(peek_ + peekPos_, peek_ + peekPos_ + n, buffer);
            peekPos_ += n;
            got = n;
        }
        if (got < size)
            got += ReadFile(buffer + got, size - got);
        return got;
    }

    std::uint64_t FileBytesConsumed() const override { return consumed_ - (peeked_ - peekPos_); }
    std::uint64_t FileBytesTotal() const override { return total_; }

  private:
    std::size_t ReadFile(char* buffer, std::size_t size) {
        errno = 0;
        const std::size_t got = std::fread(buffer, 1, size, file_);
        if (got < size && std::ferror(file_))
            FailRead(errno != 0 ? errno : EIO);
        consumed_ += got;
        return got;
    }

    std::FILE* file_ = nullptr;
    std::uint64_t total_ = 0;
    std::uint64_t consumed_ = 0;
    unsigned char peek_[2] = {};
    std::size_t peeked_ = 0;
    std::size_t peekPos_ = 0;
};

// The expansion of gzip data (one member or several in a row).
class GzipSource final : public ByteSource {
  public:
    GzipSource(std::unique_ptr<FileSource> raw, std::uint64_t maxExpandedBytes)
        : raw_(std::move(raw)), limit_(maxExpandedBytes), in_(new unsigned char[kInputBytes]) {
        if (inflateInit2(&zs_, 15 + 16) != Z_OK)
            FailLoad({}, "not enough memory to expand it");
    }
    ~GzipSource() override { inflateEnd(&zs_); }
    GzipSource(const GzipSource&) = delete;
    GzipSource& operator=(const GzipSource&) = delete;

    std::size_t Read(char* buffer, std::size_t size) override {
        if (finished_ || size == 0)
            return 0;
        if (size > kMaxOutputPerCall)
            size = kMaxOutputPerCall;
        zs_.next_out = reinterpret_cast<Bytef*>(buffer);
        zs_.avail_out = static_cast<uInt>(size);
        while (zs_.avail_out == size) {
            if (memberEnded_) {
                if (zs_.avail_in == 0 && !Refill()) {
                    finished_ = true;
                    break;
                }
                if (zs_.next_in[0] != 0x1F) {
                    FailLoad(CompressedPlace(), "unexpected data after the end of the gzip data");
                }
                inflateReset(&zs_);
                memberEnded_ = false;
            }
            if (zs_.avail_in == 0 && !Refill()) {
                FailLoad(CompressedPlace(), "the gzip data ends early (the file is truncated)");
            }
            const int rc = inflate(&zs_, Z_NO_FLUSH);
            if (rc == Z_STREAM_END) {
                memberEnded_ = true;
            } else if (rc == Z_MEM_ERROR) {
                FailLoad({}, "not enough memory to expand it");
            } else if (rc != Z_OK && rc != Z_BUF_ERROR) {
                FailLoad(CompressedPlace(), std::string("the data is not valid gzip data (") +
                                                (zs_.msg != nullptr ? zs_.msg : "error") + ")");
            }
        }
        const std::size_t produced = size - zs_.avail_out;
        expanded_ += produced;
        if (expanded_ > limit_) {
            FailLoad({}, "the compressed data expands beyond " + ByteCountText(limit_));
        }
        return produced;
    }

    std::uint64_t FileBytesConsumed() const override {
        return raw_->FileBytesConsumed() - zs_.avail_in;
    }
    std::uint64_t FileBytesTotal() const override { return raw_->FileBytesTotal(); }

  private:
    static constexpr std::size_t kInputBytes = std::size_t{256} * 1024;
    static constexpr std::size_t kMaxOutputPerCall = std::size_t{1} << 30;

    bool Refill() {
        const std::size_t got = raw_->Read(reinterpret_cast<char*>(in_.get()), kInputBytes);
        zs_.next_in = in_.get();
        zs_.avail_in = static_cast<uInt>(got);
        return got > 0;
    }

    std::string CompressedPlace() const {
        return "byte " + std::to_string(FileBytesConsumed()) + " of the compressed data";
    }

    std::unique_ptr<FileSource> raw_;
    std::uint64_t limit_;
    std::unique_ptr<unsigned char[]> in_;
    z_stream zs_{};
    std::uint64_t expanded_ = 0;
    bool memberEnded_ = false;
    bool finished_ = false;
};

}  // namespace

std::unique_ptr<ByteSource> OpenDecodedFile(const std::string& path,
                                            std::uint64_t maxExpandedBytes) {
    auto file = std::make_unique<FileSource>(path);
    unsigned char head[2];
    const std::size_t n = file->Peek(head, sizeof head);
    if (IsGzipSignature(head, n))
        return std::make_unique<GzipSource>(std::move(file), maxExpandedBytes);
    return file;
}

std::string ReadDecodedFile(const std::string& path, std::uint64_t maxBytes) {
    auto source = OpenDecodedFile(path, maxBytes);
    std::string text;
    char block[64 * 1024];
    while (const std::size_t got = source->Read(block, sizeof block)) {
        if (text.size() + got > maxBytes)
            FailLoad({}, "the file is larger than " + ByteCountText(maxBytes));
        text.append(block, got);
    }
    return text;
}

}  // namespace vtr::seqlib::detail
