#include "InspectVerb.h"

#include "Discovery.h"
#include "DocumentJSON.h"
#include "DocumentText.h"
#include "Failure.h"
#include "InputFile.h"
#include "Messages.h"
#include "Output.h"
#include "Trouble.h"

#include <Orvane/OVDocument.h>
#include <Orvane/OVException.h>

#include <optional>
#include <system_error>

namespace Commands {

namespace {

void checkBase(const std::string& url) {
    try {
        OVDocument::read({}, url);
    } catch (const OVException& wrong) {
        throw Failure(ExitStatus::Usage, std::string("--base: ") + wrong.what());
    }
}

bool isOfTheWeb(const std::string& file) {
    return file.starts_with("http://") || file.starts_with("https://");
}

std::string fetched(const std::string& url) {
    const Discovery::Fetched result = Discovery::fetch(url);
    if (!result.isDocument) throw Trouble::ofChange(url, result.error);
    return result.feed->XMLData().value_or("");
}

/// None, and a message to the user, if the file cannot be read.
std::optional<std::string> contentOf(const std::string& file) {
    try {
        return isOfTheWeb(file) ? fetched(file) : InputFile::read(file);
    } catch (const Failure& failure) {
        Messages::complain("inspect", failure.what());
        return std::nullopt;
    } catch (const std::system_error& failure) {
        Messages::complain("inspect", failure.what());
        return std::nullopt;
    }
}

bool inspect(const std::string& file, const Arguments& arguments) {
    const std::optional<std::string> bytes = contentOf(file);
    if (!bytes) return false;
    const auto contents =
        arguments.has("tidied") ? OVDocument::Contents::Tidied : OVDocument::Contents::AsStored;
    const std::string own = isOfTheWeb(file) ? file : "";
    const OVDocument document =
        OVDocument::read(*bytes, arguments.value("base").value_or(own), contents);
    const bool isJSON = arguments.has("json") || arguments.has("jsonl");
    Output::write(isJSON ? DocumentJSON::line(file, document) : DocumentText::text(file, document));
    return true;
}

}  // namespace

const VerbSpec& InspectVerb::getSpec() const {
    static const VerbSpec sSpec{
        .name = "inspect",
        .summary = "show what documents are read as",
        .operands = "FILE|URL...",
        .fewest = 1,
        .most = VerbSpec::kAny,
        .kind = WordKind::File,
        .options = {{"json", 0, "", "One JSON object for each file, on a line of its own"},
                    {"jsonl", 0, "", "The same"},
                    {"base", 0, "URL", "The URL of the documents, which relative ones count from"},
                    {"tidied", 0, "",
                     "Contents of entries as they are shown, not as they are stored"}},
        .details =
            "A document may be a feed, a single entry, a web page, or a person's description, "
            "of whatever quality. \"-\" is standard input, and what begins with http:// or "
            "https:// is fetched. A file that cannot be read is told "
            "about on standard error, the others are shown all the same, and the exit status "
            "is 4.",
        .examples = {"inspect feed.xml", "inspect --json *.rss"},
    };
    return sSpec;
}

ExitStatus InspectVerb::run(const Arguments& arguments) {
    checkBase(arguments.value("base").value_or(""));
    bool allWereRead = true;
    for (const std::string& file : arguments.operands()) {
        if (!inspect(file, arguments)) allWereRead = false;
    }
    return allWereRead ? ExitStatus::Done : ExitStatus::PartlyFailed;
}

}  // namespace Commands
