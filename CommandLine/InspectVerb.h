#pragma once

#include "Verb.h"

#include <Orvane/OVDocument.h>

#include <string>
#include <vector>

namespace Commands {

/// `orvane inspect`: what the parser makes of documents, one after the other.
class InspectVerb : public Verb {
 public:
    const char* getName() const override { return "inspect"; }
    const char* getSummary() const override { return "Show what documents are read as"; }
    void addOptions(CLI::App& app) override;
    ExitStatus run() override;

 private:
    /// Whether the file could be read.
    bool inspect(const std::string& file) const;
    std::string describe(const std::string& file, const OVDocument& document) const;

    bool mAsJSON = false;
    bool mTidied = false;
    std::string mBase;
    std::vector<std::string> mFiles;
};

}  // namespace Commands
