#pragma once

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "engine/ICheck.h"
#include "engine/LibVerify.h"
#include "support/VerifierFixture.h"

// Fixtures of the sequence checks: sequence files written as text into the test's folder,
// and a suite whose settings store the test controls.
namespace vtr::testsupport {

// The text of a sequence file, built channel by channel and track by track:
//
//   SequenceText seq;
//   seq.Channel(1, "Roof", R"(deviceType="1" unit="10" circuit="1")")   // on: one event
//      .Channel(2, "Yard", "", false)                                    // never on
//      .Track("House", {1, 2});
//   WriteFileBytes(path, seq.Xml());
class SequenceText {
  public:
    // A channel with the given attributes (device settings, type, subsequence ...) and one
    // event that is on within the sequence, or one whose level is 0.
    SequenceText& Channel(int id, const std::string& name, const std::string& attributes = {},
                          bool on = true) {
        channels_ += "<channel id=\"" + std::to_string(id) + "\" name=\"" + name + "\" " +
                     attributes + ">" +
                     (on ? "<event start=\"0\" end=\"500\" intensity=\"80\"/>"
                         : "<event start=\"0\" end=\"500\" intensity=\"0\"/>") +
                     "</channel>\n";
        return *this;
    }
    // A track listing the channels by id; `inner` adds intensity files; `attributes` its
    // length, say.
    SequenceText& Track(const std::string& name, const std::vector<int>& ids,
                        const std::string& inner = {}, const std::string& attributes = {}) {
        tracks_ += "<track name=\"" + name + "\" " + attributes + ">";
        for (int id : ids)
            tracks_ += "<channelRef id=\"" + std::to_string(id) + "\"/>";
        tracks_ += inner + "</track>\n";
        return *this;
    }
    // Attributes of the sequence element (media, shellCommand ...).
    SequenceText& Attributes(const std::string& attributes) {
        attributes_ = attributes;
        return *this;
    }
    std::string Xml() const {
        return "<?xml version=\"1.0\" encoding=\"UTF-8\"?>\n<sequence formatVersion=\"1\" "
               "length=\"1000\" " +
               attributes_ + ">\n<channels>\n" + channels_ + "</channels>\n<tracks>\n" + tracks_ +
               "</tracks>\n</sequence>\n";
    }

  private:
    std::string attributes_;
    std::string channels_;
    std::string tracks_;
};

// An intensity file of a track: `devices` are <device .../> elements.
inline std::string IntensityFileXml(const std::string& kind, const std::string& devices) {
    return "<intensityFile kind=\"" + kind + "\" name=\"" + kind + ".dat\">" + devices +
           "</intensityFile>";
}
inline std::string DeviceXml(int type, int network, int unit, int start, int count) {
    return "<device deviceType=\"" + std::to_string(type) + "\" network=\"" +
           std::to_string(network) + "\" unit=\"" + std::to_string(unit) + "\" start=\"" +
           std::to_string(start) + "\" count=\"" + std::to_string(count) + "\"/>";
}

// A suite in the test's folder (see SuiteTest) with sequence files of the test's own.
class SequenceCheckTest : public SuiteTest {
  protected:
    ~SequenceCheckTest() override { LibVerify::DeleteTempFiles(); }

    // Writes the sequence into the data folder and returns its path.
    std::string WriteSequence(const std::string& name, const SequenceText& sequence) {
        const std::string path = DataFile(name);
        WriteFileBytes(path, sequence.Xml());
        return path;
    }
    std::string WriteSequenceText(const std::string& name, const std::string& text) {
        const std::string path = DataFile(name);
        WriteFileBytes(path, text);
        return path;
    }

    // Runs the check alone (after BeginVerification); returns the descriptions of the checks
    // it queued.
    std::vector<std::string> RunCheck(ICheck& check) {
        RunAlone(check);
        return client.Lines("Added ");
    }
};

}  // namespace vtr::testsupport
