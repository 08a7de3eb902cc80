#pragma once

#include <Orvane/OVError.h>
#include <Orvane/OVObject.h>

#include <memory>
#include <optional>
#include <string>
#include <string_view>

class OVEnclosureInternal;
class OVEntry;

/// A file that an entry has attached, and the state of its download.
///
/// Getters throw `OVException` if the database cannot be read, unless they say otherwise. Thread:
/// see `OVObject`.
class OV_EXPORT OVEnclosure : public OVObject {
 public:
    using Text = std::optional<std::string>;  ///< none for what there is not

    /// The states of a download.
    enum DownloadState : int {
        NoDownload = 0,
        Requested = 1,
        Downloading = 2,
        Finished = 3,
        Failed = 4,  ///< or cancelled
        Deleted = 5,
    };

    /// An enclosure of the application's own, which is in no database. `length` is in bytes. Throws
    /// `OVException` for a URL that is none.
    static std::shared_ptr<OVEnclosure> create(const std::string& URL, const Text& MIMEType,
                                               long long length);
    /// The same for a local file, with the type that its name stands for if none is given. Null if
    /// there is no regular file of that path.
    static std::shared_ptr<OVEnclosure> createFromFile(const std::string& path,
                                                       const Text& MIMEType = {});
    /// Not there yet: warns, and gives null.
    static std::shared_ptr<OVEnclosure> createFromData(std::string_view data, const Text& MIMEType,
                                                       const Text& name, const Text& extension);

    /// The download goes on.
    ~OVEnclosure() override;

    /// The entry that it is attached to. Null if there is none, and if that cannot be read.
    std::shared_ptr<OVEntry> entry() const;
    /// Where the file is to be had, absolute.
    Text URL() const;
    /// The media type, as the feed says.
    Text MIMEType() const;
    /// Plain text.
    Text title() const;
    /// In bytes, as the feed says; 0 if it says nothing.
    long long length() const;

    /// Has the agent start or resume the download. False, with the error, if that could not be;
    /// `error`, which may be null, is cleared otherwise. How it goes is announced by
    /// `OVEnclosureDownloadStateDidChangeNotification`.
    bool download(std::optional<OVError>* error = nullptr);
    /// A `DownloadState`; `Failed` if it cannot be read.
    int downloadState() const;
    /// From 0.0 to 1.0; 0.0 if it cannot be told.
    double downloadProgress() const;
    /// What ended the last download; none if nothing did.
    std::optional<OVError> downloadError() const;
    /// Where the finished file is; none if there is none any more.
    Text downloadedPath() const;
    /// Stops the download. What is there of the file stays. A failure is reported in the log.
    void cancelDownload();
    /// Deletes the file, or what there is of it. A failure is reported in the log.
    void deleteDownload();

    /// "OVEnclosure[<URL> row]", with the row's ID. Throws as getters of values.
    std::string description() const override;
    bool isEqual(const OVObject* other) const override;
    std::size_t hash() const override;

    OVEnclosureInternal& _internal() const { return *mInternal; }

 private:
    friend class OVObjectMaker;
    explicit OVEnclosure(std::unique_ptr<OVEnclosureInternal> internal);

    std::unique_ptr<OVEnclosureInternal> mInternal;
};
