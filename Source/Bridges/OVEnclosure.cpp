#include <Orvane/OVEnclosure.h>

#include "Bridges/Barriers.h"
#include "Bridges/FileTypes.h"
#include "Bridges/OVEnclosureInternal.h"
#include "Bridges/OVEntryInternal.h"
#include "Bridges/OVObjectMaker.h"
#include "Bridges/PublicObject.h"
#include "Bridges/PublicValues.h"
#include "Model/EntryCore.h"
#include "Utilities/FileUtils.h"

#include <Orvane/OVFormat.h>
#include <Orvane/OVNotificationCenter.h>

#include <filesystem>

using namespace Foundation;
using namespace Orvane;

namespace {

std::shared_ptr<OVEnclosure> makeEnclosure(const Ref<URL>& url, const Ref<String>& type,
                                           long long length) {
    const Ref<EnclosureCore> core = Returner<EnclosureCore>::adopted(new EnclosureCore);
    core->mURL.setValue(url.get());
    core->mMIMEType.setValue(type.get());
    core->mLength.setValue(length);
    return OVObjectMaker::makeFor<OVEnclosure, OVEnclosureInternal>(core.get());
}

/// The type that the name of a file stands for; null if it stands for none.
Ref<String> deducedType(const std::filesystem::path& path) {
    const std::string extension = path.extension().string();
    const char* type = extension.empty() ? nullptr : mimeTypeOfExtension(extension.substr(1));
    const Ref<String> text = String::string(type);
    gLog.log("Deduced MIME type of '%@' for file %s", text, path.string());
    return text;
}

}  // namespace

OVEnclosure::OVEnclosure(std::unique_ptr<OVEnclosureInternal> internal)
    : mInternal(std::move(internal)) {}

OVEnclosure::~OVEnclosure() = default;

std::shared_ptr<OVEnclosure> OVEnclosure::create(const std::string& URL, const Text& MIMEType,
                                                 long long length) {
    constexpr const char* kWhere = "-[OVEnclosure initWithURL:MIMEType:length:]";
    requireParameter(!URL.empty(), kWhere, "url");
    return raising(kWhere, [&] { return makeEnclosure(urlOf(URL), stringOf(MIMEType), length); });
}

std::shared_ptr<OVEnclosure> OVEnclosure::createFromFile(const std::string& path,
                                                         const Text& MIMEType) {
    return raising("-[OVEnclosure initWithPath:MIMEType:]", [&]() -> std::shared_ptr<OVEnclosure> {
        std::error_code error;
        const std::filesystem::path file = std::filesystem::canonical(path, error);
        if (error || !std::filesystem::is_regular_file(file, error)) return nullptr;
        const auto length = std::filesystem::file_size(file, error);
        if (error) return nullptr;
        const Ref<Foundation::URL> url =
            Foundation::URL::urlWithFileSystemPath(file.c_str(), false);
        return makeEnclosure(url, MIMEType ? stringOf(MIMEType) : deducedType(file),
                             static_cast<long long>(length));
    });
}

std::shared_ptr<OVEnclosure> OVEnclosure::createFromData(std::string_view, const Text&, const Text&,
                                                         const Text&) {
    gWarn.log("-[OVEnclosure initWithData:MIMEType:name:extension:] currently unimplemented!");
    return nullptr;
}

std::shared_ptr<OVEntry> OVEnclosure::entry() const {
    return reporting("-[OVEnclosure entry]", [&] {
        std::shared_ptr<OVEntry> entry = publicObject<OVEntry>(mInternal->core().getEntry());
        if (entry && mInternal->client) entry->_internal()._setClient(mInternal->client);
        return entry;
    });
}

OVEnclosure::Text OVEnclosure::URL() const {
    return raising("-[OVEnclosure URL]", [&] { return textOf(mInternal->core().mURL.getValue()); });
}

OVEnclosure::Text OVEnclosure::MIMEType() const {
    return raising("-[OVEnclosure MIMEType]",
                   [&] { return textOf(mInternal->core().mMIMEType.getValue()); });
}

OVEnclosure::Text OVEnclosure::title() const {
    return raising("-[OVEnclosure title]",
                   [&] { return textOf(mInternal->core().mTitle.getValue()); });
}

long long OVEnclosure::length() const {
    return raising("-[OVEnclosure length]", [&] { return mInternal->core().mLength.getValue(); });
}

bool OVEnclosure::download(std::optional<OVError>* error) {
    std::optional<OVError> failure;
    const bool isStarted = reporting(
        "-[OVEnclosure download:]",
        [&] {
            EnclosureCore& core = mInternal->core();
            return core.getRowID() != 0 && core.download();
        },
        &failure);
    if (!isStarted && !failure) failure = errorWithCode(OVInternalError, {});
    if (error) *error = failure;
    return isStarted;
}

int OVEnclosure::downloadState() const {
    return reporting(
               "-[OVEnclosure downloadState]",
               [&] { return std::optional<int>(mInternal->core().mDownloadState.getValue()); })
        .value_or(Failed);
}

double OVEnclosure::downloadProgress() const {
    return reporting("-[OVEnclosure downloadProgress]",
                     [&] { return mInternal->core().getDownloadProgress(); });
}

std::optional<OVError> OVEnclosure::downloadError() const {
    return reporting("-[OVEnclosure downloadError]", [&]() -> std::optional<OVError> {
        const EnclosureCore& core = mInternal->core();
        const NetError error = core.getDownloadError();
        if (error.code == 0) return std::nullopt;
        return errorWithNetError(error, textOf(core.mURL.getValue()).value_or(""));
    });
}

OVEnclosure::Text OVEnclosure::downloadedPath() const {
    return raising("-[OVEnclosure downloadedPath]", [&]() -> Text {
        EnclosureCore& core = mInternal->core();
        const Ref<Foundation::URL> file = core.mDownloadedPath.getValue();
        std::string path = file.get() ? file->getFileSystemRepresentation() : std::string();
        if (path.empty()) return std::nullopt;
        if (FileUtils::exists(file.get())) return path;
        core.checkDownload();
        return std::nullopt;
    });
}

void OVEnclosure::cancelDownload() {
    reporting("-[OVEnclosure cancelDownload]", [&] { return mInternal->core().cancelDownload(); });
}

void OVEnclosure::deleteDownload() {
    const bool isDeleted = reporting("-[OVEnclosure deleteDownload]",
                                     [&] { return mInternal->core().deleteDownload(); });
    if (!isDeleted) return;
    OVNotificationCenter::defaultCenter().post(
        {OVEnclosureDownloadStateDidChangeNotification, shared_from_this(), {}});
}

std::string OVEnclosure::description() const {
    return raising("-[OVEnclosure description]", [&] {
        const EnclosureCore& core = mInternal->core();
        return OVFormat("%s[<%@> %qi]", "OVEnclosure", core.mURL.getValue(), core.getRowID());
    });
}

bool OVEnclosure::isEqual(const OVObject* other) const {
    const auto* enclosure = dynamic_cast<const OVEnclosure*>(other);
    return enclosure && IsEqual(mInternal->peek(), enclosure->mInternal->peek());
}

std::size_t OVEnclosure::hash() const {
    return mInternal->peek()->getPFHashCode();
}
