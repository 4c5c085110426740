// Writes the demo installation's help file: vtr-demo-help OUTPUT.chm
//
// The suite installs its own help file next to its programs; the demo installation has
// none, so this one stands in for it: the Verifier's page and one page per message of the
// catalog, reached through the context map by each message's help-context id.
#include <cstdio>
#include <exception>
#include <string>

#include "ChmWriter.h"
#include "engine/Messages.h"

namespace {

std::string Escaped(const std::string& text) {
    std::string out;
    for (char c : text) {
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
            default:
                out += c;
        }
    }
    return out;
}

std::string Page(const std::string& title, const std::string& body) {
    return "<html><head><meta charset=\"utf-8\"><title>" + Escaped(title) +
           "</title><link rel=\"stylesheet\" type=\"text/css\" "
           "href=\"/help.css\"></head><body><h1>" +
           Escaped(title) + "</h1>" + body + "</body></html>";
}

std::string MessagePage(const std::string& name) {
    return "messages/" + name + ".htm";
}

const char* const kStyle =
    "body { font-family: sans-serif; } h1 { color: #1f4e79; font-size: 16pt; }"
    " .severity { font-weight: bold; } td { padding-right: 12px; }";

const char* const kVerifierPage =
    "<p>The Verifier inspects the show-lighting installation before the show runs and "
    "reports, as Info, Warning and Error results, what will go wrong.</p>"
    "<h2>Choosing what to verify</h2>"
    "<ul><li><b>Verify a Single Sequence</b>: one sequence file (.las animation or .lms "
    "musical).</li><li><b>Verify a Single Show</b>: one show file (.lss) with all its "
    "sequences.</li><li><b>Verify Entire Schedule</b>: the weekly and calendar schedules of "
    "the user-data folder, every scheduled show and every sequence they use.</li></ul>"
    "<p>Press <b>Verify</b> (F5). <b>Cancel</b> (Esc) stops a verification; the check that is "
    "running finishes first.</p>"
    "<h2>Reading the results</h2>"
    "<p>The <b>Output Log</b> shows every step with its time; results are coloured by "
    "severity. The <b>Results</b> tab lists the findings, the <b>Ignored Results</b> tab the "
    "findings you chose to ignore. Click a column heading to sort.</p>"
    "<p>Right-click a result (or press the menu key) for <b>Help on this result</b>, "
    "<b>Ignore this result</b> (Delete) and <b>Ignore all results with this message "
    "number</b> (Shift+Delete). Ignored results are remembered for later "
    "verifications.</p>"
    "<h2>Saving</h2><p><b>Save</b> (Ctrl+S) writes the results that are not ignored to a text "
    "file.</p>";

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: vtr-demo-help OUTPUT.chm\n");
        return 64;
    }
    vtr::testsupport::ChmContent help;
    help.title = "Vantori Verifier Help";
    help.defaultTopic = "Verifier.htm";
    help.files.emplace_back("/help.css", kStyle);
    help.files.emplace_back("/Verifier.htm", Page("The Vantori Verifier", kVerifierPage));
    std::string index = "<table>";
    for (const vtr::Message& message : vtr::Messages::kAll) {
        const std::string name = "msg" + std::to_string(message.number);
        const std::string severity = vtr::SeverityText(message.severity);
        help.files.emplace_back(
            "/" + MessagePage(name),
            Page(message.summary,
                 "<p>Message " + std::to_string(message.number) + ", <span class=\"severity\">" +
                     severity +
                     "</span>.</p><p>The result's detail lines name the show, section, sequence, "
                     "track, channel or file concerned. Correct it in the suite and verify "
                     "again, or, when it is harmless, ignore the result from its pop-up "
                     "menu.</p><p><a href=\"../Verifier.htm\">The Verifier</a></p>"));
        help.contextMap.emplace_back(static_cast<uint32_t>(message.helpContextId),
                                     MessagePage(name));
        index += "<tr><td>" + std::to_string(message.number) + "</td><td><a href=\"" +
                 MessagePage(name) + "\">" + Escaped(message.summary) + "</a></td><td>" + severity +
                 "</td></tr>";
    }
    index += "</table>";
    help.files[1].second =
        Page("The Vantori Verifier", std::string(kVerifierPage) + "<h2>Messages</h2>" + index);
    try {
        vtr::testsupport::WriteChm(argv[1], help);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "vtr-demo-help: %s\n", error.what());
        return 1;
    }
    return 0;
}
