// The settings store file (registry-export text, UTF-8 or UTF-16LE). Any bytes read as a
// store or as a store that is not understood, without failing. A store that is understood
// and not empty writes back byte for byte as it was read. Changes made to it either are
// refused and change nothing, or give bytes that read back, from the bytes alone, to
// exactly the store with that change.
//
// The same changes made as one batch are either refused whole, changing nothing, or give bytes
// that read back to exactly the store with all of them.
//
// The first byte of the input picks the changes, the next up to 24 bytes are the text of a
// string value to set; the rest is the file.

#include <algorithm>
#include <cstdint>
#include <string>

#include "FuzzSupport.h"
#include "environment/RegistryFile.h"

namespace {

using vtr::fuzz::Printable;
using vtr::RegistryFile::Document;
using vtr::RegistryFile::Key;
using vtr::RegistryFile::KeyPath;
using vtr::RegistryFile::Value;

// A store with nothing in it but blank lines (in either encoding, after any byte-order
// mark): it has no header yet and gets one when it is first written.
bool AllBlank(std::string_view bytes) {
    for (const std::string_view mark :
         {std::string_view("\xEF\xBB\xBF"), std::string_view("\xFF\xFE")}) {
        if (bytes.substr(0, mark.size()) == mark) {
            bytes.remove_prefix(mark.size());
            break;
        }
    }
    return std::all_of(bytes.begin(), bytes.end(), [](char c) {
        return c == ' ' || c == '\t' || c == '\r' || c == '\n' || c == '\0';
    });
}

// The deepest key reached by always taking the first subkey, and its path.
KeyPath FirstLeaf(const Key& root) {
    KeyPath path;
    const Key* key = &root;
    while (!key->subkeys.empty() && path.size() < 16) {
        const Key& next = key->subkeys.begin()->second;
        path.push_back(next.name);
        key = &next;
    }
    return path;
}

// One change: refused without a trace, or written as bytes that read back to the change.
template <typename Change>
void Apply(Document& document, const char* what, std::string_view file, Change&& change) {
    const std::optional<std::string> before = document.Serialize();
    const Key rootBefore = document.Root();
    const int32_t status = change(document);
    const std::string context = std::string(what) + "\nfile: " + Printable(file);
    if (status != 0) {
        VTR_FUZZ_CHECK(document.Serialize() == before,
                       context + "\nrefused with " + std::to_string(status) + " but changed");
        VTR_FUZZ_CHECK(vtr::RegistryFile::SameContent(document.Root(), rootBefore), context);
        return;
    }
    const std::optional<std::string> bytes = document.Serialize();
    VTR_FUZZ_CHECK(bytes.has_value(), context + "\nchanged but cannot be written");
    const Document reread = Document::Parse(*bytes);
    VTR_FUZZ_CHECK(reread.Understood(), context + "\nwritten: " + Printable(*bytes));
    VTR_FUZZ_CHECK(vtr::RegistryFile::SameContent(reread.Root(), document.Root()),
                   context + "\nwritten: " + Printable(*bytes));
    VTR_FUZZ_CHECK(reread.Serialize() == bytes, context + "\nwritten: " + Printable(*bytes));
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, std::size_t size) {
    std::string_view input = vtr::fuzz::AsText(data, size);
    const uint8_t choice = vtr::fuzz::TakeByte(input);
    const std::size_t textLength = std::min<std::size_t>(input.size(), choice % 25);
    const std::string text(input.substr(0, textLength));
    const std::string_view file = input.substr(textLength);

    Document document = Document::Parse(file);
    if (!document.Understood()) {
        VTR_FUZZ_CHECK(!document.Serialize().has_value(), Printable(file));
        VTR_FUZZ_CHECK(document.SetValue({"Software"}, "x", Value::Dword(1)) != 0, Printable(file));
        return 0;
    }
    if (!AllBlank(file)) {
        const std::optional<std::string> written = document.Serialize();
        VTR_FUZZ_CHECK(
            written.has_value() && *written == file,
            "file: " + Printable(file) + "\nwritten: " + Printable(written.value_or("")));
    }

    const KeyPath verifier = {"Software", "Vantori", "Verifier"};
    if (choice & 0x80) {
        Apply(document, "create the ignore-list key", file,
              [&](Document& d) { return d.CreateKey(verifier); });
        Apply(document, "set a string", file,
              [&](Document& d) { return d.SetValue(verifier, "IgnoreMsg1", Value::String(text)); });
        Apply(document, "set a number", file, [&](Document& d) {
            return d.SetValue(verifier, "CountIgnoreMsg", Value::Dword(choice * 0x01010101u));
        });
    }
    if (choice & 0x10) {
        // A batch: the ignore list's key, a value of the first key the file gives, a new key.
        Document batch = Document::Parse(file);
        const std::optional<std::string> before = batch.Serialize();
        const Key rootBefore = batch.Root();
        const KeyPath first = FirstLeaf(batch.Root());
        batch.BeginBatch();
        batch.CreateKey(verifier);
        batch.SetValue(verifier, "IgnoreMsg1", Value::String(text));
        batch.SetValue(verifier, "CountIgnoreMsg", Value::Dword(choice));
        batch.SetValue(first, "Added", (choice & 1) ? Value::Dword(choice) : Value::String(text));
        batch.SetValue(verifier, "IgnoreMsg1", Value::String(text + "2"));
        batch.CreateKey({"Software", "New"});
        const Key changed = batch.Root();
        const std::string context = "batch\nfile: " + Printable(file);
        if (batch.EndBatch() != 0) {
            VTR_FUZZ_CHECK(batch.Serialize() == before, context + "\nrefused but changed");
            VTR_FUZZ_CHECK(vtr::RegistryFile::SameContent(batch.Root(), rootBefore), context);
        } else {
            const std::optional<std::string> bytes = batch.Serialize();
            VTR_FUZZ_CHECK(bytes.has_value(), context + "\nchanged but cannot be written");
            const Document reread = Document::Parse(*bytes);
            VTR_FUZZ_CHECK(reread.Understood() &&
                               vtr::RegistryFile::SameContent(reread.Root(), changed) &&
                               vtr::RegistryFile::SameContent(batch.Root(), changed),
                           context + "\nwritten: " + Printable(*bytes));
            VTR_FUZZ_CHECK(reread.Serialize() == bytes,
                           context + "\nwritten: " + Printable(*bytes));
        }
    }
    const KeyPath leaf = FirstLeaf(document.Root());
    if (!leaf.empty()) {
        if (choice & 0x40) {
            // Replaces a value the file already gives, or adds one to a key it already has.
            const Key* key = document.FindKey(leaf);
            const std::string name = key && !key->values.empty() ? key->values.begin()->second.name
                                                                 : std::string("Added");
            Apply(document, "replace a value", file, [&](Document& d) {
                return d.SetValue(leaf, name,
                                  (choice & 1) ? Value::Dword(choice) : Value::String(text));
            });
        }
        if (choice & 0x20) {
            Apply(document, "delete a key", file, [&](Document& d) { return d.DeleteKey(leaf); });
        }
    }
    return 0;
}
