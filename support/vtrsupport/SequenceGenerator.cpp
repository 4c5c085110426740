#include "vtrsupport/SequenceGenerator.h"

#include <zlib.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <cstdio>
#include <functional>
#include <limits>
#include <system_error>

#include "engine/VtrError.h"

namespace vtr::seqlib::SequenceGenerator {

namespace {

constexpr int64_t kBytesPerEvent = 57;  // a typical event line
constexpr std::size_t kFlushBytes = 1 << 20;

void AppendNumber(std::string& out, int64_t value) {
    char digits[24];
    const auto end = std::to_chars(digits, digits + sizeof digits, value).ptr;
    out.append(digits, end);
}

void AppendAttribute(std::string& out, const char* name, int64_t value) {
    out += ' ';
    out += name;
    out += "=\"";
    AppendNumber(out, value);
    out += '"';
}

void AppendEscaped(std::string& out, const std::string& text) {
    for (const char c : text) {
        switch (c) {
            case '&':
                out += "&amp;";
                break;
            case '<':
                out += "&lt;";
                break;
            case '>':
                out += "&gt;";
                break;
            case '"':
                out += "&quot;";
                break;
            default:
                out += c;
        }
    }
}

void AppendTextAttribute(std::string& out, const char* name, const std::string& value) {
    out += ' ';
    out += name;
    out += "=\"";
    AppendEscaped(out, value);
    out += '"';
}

// Writes the text in slices; `flush` takes what has been built so far.
Written Generate(const Options& o, const std::function<void(std::string&)>& flush) {
    Written written;
    std::string out;
    out.reserve(kFlushBytes + 4096);
    const auto flushIfFull = [&] {
        if (out.size() >= kFlushBytes) {
            written.xmlBytes += out.size();
            flush(out);
            out.clear();
        }
    };
    const int32_t channels = std::max(0, o.channels);
    const int32_t tracks = std::max(0, o.tracks);
    const int32_t shared = std::clamp(o.sharedChannels, 0, channels);
    const int32_t subsequenceEnd =
        std::clamp(shared + std::max(0, o.subsequenceChannels), 0, channels);
    const int32_t offStart = channels - std::clamp(o.offChannels, 0, channels);
    const int32_t events = std::max(0, o.eventsPerChannel);
    const int64_t step = std::max<int64_t>(1, o.length / std::max(1, events));

    out += "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<sequence formatVersion=\"1\"";
    AppendAttribute(out, "length", o.length);
    if (!o.media.empty())
        AppendTextAttribute(out, "media", o.media);
    if (!o.shellCommand.empty())
        AppendTextAttribute(out, "shellCommand", o.shellCommand);
    out += ">\n  <channels>\n";
    for (int32_t i = 0; i < channels; ++i) {
        out += "    <channel";
        AppendAttribute(out, "id", i + 1);
        out += " name=\"Channel ";
        AppendNumber(out, i + 1);
        out += '"';
        if (i >= shared && i < subsequenceEnd) {
            out += " type=\"6\"";
            AppendTextAttribute(out, "subsequence", o.subsequenceFile);
        } else {
            out += " deviceType=\"1\"";
            AppendAttribute(out, "network", ChannelNetwork(i));
            AppendAttribute(out, "unit", ChannelUnit(i));
            AppendAttribute(out, "circuit", ChannelCircuit(i));
        }
        out += ">\n";
        const bool off = i >= offStart;
        for (int32_t k = 0; k < events; ++k) {
            const int64_t start = k * step;
            out += "      <event";
            AppendAttribute(out, "start", start);
            AppendAttribute(out, "end", start + step);
            const int64_t level = off ? 0 : 1 + (k * 37 + i) % 100;
            if (k % 4 == 3) {
                AppendAttribute(out, "from", level);
                out += " to=\"0\"";
            } else {
                AppendAttribute(out, "intensity", level);
            }
            out += "/>\n";
            flushIfFull();
        }
        written.events += events;
        out += "    </channel>\n";
    }
    out += "  </channels>\n  <tracks>\n";
    for (int32_t t = 0; t < tracks; ++t) {
        out += "    <track name=\"Track ";
        AppendNumber(out, t + 1);
        out += "\">\n";
        for (int32_t i = 0; i < channels; ++i) {
            if (i < shared || (i - shared) % tracks == t) {
                out += "      <channelRef";
                AppendAttribute(out, "id", i + 1);
                out += "/>\n";
                flushIfFull();
            }
        }
        const auto writeFile = [&](const char* kind, const char* name, int32_t devices,
                                   bool gridcraft) {
            out += "      <intensityFile kind=\"";
            out += kind;
            out += "\" name=\"";
            out += name;
            out += "\">\n";
            for (int32_t d = 0; d < devices; ++d) {
                out += "        <device deviceType=\"7\"";
                AppendAttribute(out, "network", gridcraft ? 1 + d / 170 : 500 + d);
                AppendAttribute(out, "start", gridcraft ? 1 + (d % 170) * 3 : 1);
                AppendAttribute(out, "count", gridcraft ? 3 : 510);
                out += "/>\n";
                flushIfFull();
            }
            out += "      </intensityFile>\n";
        };
        if (t == 0 && o.gridcraftDevices >= 0) {
            writeFile("Gridcraft", "Grid.gci", o.gridcraftDevices, true);
        }
        if (t == tracks - 1 && o.novaluxDevices >= 0) {
            writeFile("Novalux", "Nova.nvx", o.novaluxDevices, false);
        }
        out += "    </track>\n";
    }
    out += "  </tracks>\n</sequence>\n";
    written.xmlBytes += out.size();
    flush(out);
    return written;
}

[[noreturn]] void FailWrite(const std::string& path, int error) {
    Raise(ErrorNumbers::UserMessage, "SequenceGenerator.WriteFile",
          "Cannot write \"" + path + "\": " + std::generic_category().message(error));
}

}  // namespace

std::string Gzip(std::string_view bytes, int level) {
    constexpr const char* kSource = "SequenceGenerator.Gzip";
    if (bytes.size() > std::numeric_limits<uInt>::max() / 2)
        Raise(ErrorNumbers::UserMessage, kSource, "Too much to compress in one piece");
    z_stream zs{};
    if (deflateInit2(&zs, level, Z_DEFLATED, 15 + 16, 8, Z_DEFAULT_STRATEGY) != Z_OK)
        Raise(ErrorNumbers::UserMessage, kSource, "Cannot start compressing");
    std::string out(deflateBound(&zs, static_cast<uLong>(bytes.size())) + 32, '\0');
    zs.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(bytes.data()));
    zs.avail_in = static_cast<uInt>(bytes.size());
    zs.next_out = reinterpret_cast<Bytef*>(out.data());
    zs.avail_out = static_cast<uInt>(out.size());
    const int status = deflate(&zs, Z_FINISH);
    out.resize(zs.total_out);
    deflateEnd(&zs);
    if (status != Z_STREAM_END)
        Raise(ErrorNumbers::UserMessage, kSource, "Cannot compress");
    return out;
}

int32_t ChannelNetwork(int32_t index) {
    return index / 3840 % 16;
}
int32_t ChannelUnit(int32_t index) {
    return 1 + index / 16 % 240;
}
int32_t ChannelCircuit(int32_t index) {
    return 1 + index % 16;
}

std::string Xml(const Options& options) {
    std::string text;
    Generate(options, [&](std::string& slice) { text += slice; });
    return text;
}

Written WriteFile(const std::string& path, const Options& options) {
    Written written;
    if (options.compressed) {
        gzFile file = gzopen(path.c_str(), "wb");
        if (file == nullptr)
            FailWrite(path, errno != 0 ? errno : EIO);
        gzbuffer(file, 256 * 1024);
        gzsetparams(file, options.compressionLevel, Z_DEFAULT_STRATEGY);
        bool ok = true;
        written = Generate(options, [&](std::string& slice) {
            if (ok && !slice.empty() &&
                gzwrite(file, slice.data(), static_cast<unsigned>(slice.size())) == 0) {
                ok = false;
            }
        });
        if (gzclose(file) != Z_OK || !ok)
            FailWrite(path, EIO);
    } else {
        std::FILE* file = std::fopen(path.c_str(), "wb");
        if (file == nullptr)
            FailWrite(path, errno);
        bool ok = true;
        written = Generate(options, [&](std::string& slice) {
            if (ok && std::fwrite(slice.data(), 1, slice.size(), file) != slice.size())
                ok = false;
        });
        if (std::fclose(file) != 0 || !ok)
            FailWrite(path, EIO);
    }
    std::FILE* check = std::fopen(path.c_str(), "rb");
    if (check != nullptr) {
        std::fseek(check, 0, SEEK_END);
        written.fileBytes = static_cast<std::uint64_t>(std::ftell(check));
        std::fclose(check);
    }
    return written;
}

int32_t EventsPerChannelFor(std::uint64_t targetBytes, int32_t channels) {
    if (channels <= 0)
        return 0;
    const auto perChannel =
        static_cast<int64_t>(targetBytes / static_cast<std::uint64_t>(channels));
    return static_cast<int32_t>(std::max<int64_t>(1, perChannel / kBytesPerEvent));
}

}  // namespace vtr::seqlib::SequenceGenerator
