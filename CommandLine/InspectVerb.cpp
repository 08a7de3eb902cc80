#include "InspectVerb.h"

#include "DocumentJSON.h"
#include "DocumentText.h"
#include "InputFile.h"
#include "Output.h"

#include <Orvane/OVException.h>
#include <CLI/CLI.hpp>

#include <cstdio>
#include <optional>
#include <system_error>

namespace Commands {

namespace {

constexpr const char* kDetails =
    "A document may be a feed, a single entry, a web page, or a person's description, of\n"
    "whatever quality. With --json, each line of the output is one object for one file. A file\n"
    "that cannot be read is told about on standard error, the others are shown all the same,\n"
    "and the exit status is 4.";

/// What is wrong with a base URL; empty if nothing is.
std::string complaintAbout(const std::string& url) {
    try {
        OVDocument::read({}, url);
        return {};
    } catch (const OVException& wrong) {
        return wrong.what();
    }
}

/// None, and a message to the user, if the file cannot be read.
std::optional<std::string> contentOf(const std::string& file) {
    try {
        return InputFile::read(file);
    } catch (const std::system_error& failure) {
        const std::string message = "orvane inspect: " + std::string(failure.what()) + '\n';
        std::fputs(message.c_str(), stderr);
        return std::nullopt;
    }
}

}  // namespace

void InspectVerb::addOptions(CLI::App& app) {
    app.add_flag("--json", mAsJSON, "One JSON object for each file, on a line of its own");
    app.add_option("--base", mBase, "The URL of the documents, which relative ones count from")
        ->type_name("URL")
        ->check(complaintAbout, "");
    app.add_flag("--tidied", mTidied,
                 "Contents of entries as they are shown, not as they are stored");
    app.add_option("FILE", mFiles, "The files to read; \"-\" is standard input")
        ->type_name("")
        ->required();
    app.footer(kDetails);
}

ExitStatus InspectVerb::run() {
    bool allWereRead = true;
    for (const std::string& file : mFiles) {
        if (!inspect(file)) allWereRead = false;
    }
    return allWereRead ? ExitStatus::Done : ExitStatus::PartlyFailed;
}

bool InspectVerb::inspect(const std::string& file) const {
    const std::optional<std::string> bytes = contentOf(file);
    if (!bytes) return false;
    const auto contents = mTidied ? OVDocument::Contents::Tidied : OVDocument::Contents::AsStored;
    Output::write(describe(file, OVDocument::read(*bytes, mBase, contents)));
    return true;
}

std::string InspectVerb::describe(const std::string& file, const OVDocument& document) const {
    return mAsJSON ? DocumentJSON::line(file, document) : DocumentText::text(file, document);
}

}  // namespace Commands
