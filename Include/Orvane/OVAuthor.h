#pragma once

#include <Orvane/OVObject.h>

#include <memory>
#include <optional>
#include <string>

class CBPerson;
class OVAuthorInternal;

/// A person who wrote entries.
///
/// Getters throw `OVException` if the database cannot be read. Thread: see `OVObject`.
class OV_EXPORT OVAuthor : public OVObject {
 public:
    using Text = std::optional<std::string>;  ///< none for what there is not

    /// An author of the application's own, who is in no database. Throws `OVException` if all three
    /// are missing, and for a `URL` that is none.
    static std::shared_ptr<OVAuthor> create(const Text& name, const Text& email, const Text& URL);

    /// The author that a person of the address book is. There is no address book yet: null. Throws
    /// `OVException` for null.
    static std::shared_ptr<OVAuthor> create(const CBPerson* person);

    ~OVAuthor() override;

    /// Plain text.
    Text name() const;
    /// An address of mail, as the feed has it.
    Text email() const;
    /// That of the person's page, absolute.
    Text URL() const;
    /// The first of these that is not empty; none if all are.
    Text nameForDisplay() const;

    /// The person's identifier in the user's address book.
    Text contactBookUID() const;
    /// None clears it. Throws `OVException` if the agent cannot do that.
    void setContactBookUID(const Text& uid);

    /// The person of that identifier. There is no address book yet: null.
    CBPerson* person() const;
    /// Null clears the identifier. Throws `OVException` for a person, of whom nothing can be had.
    void setPerson(const CBPerson* person);

    /// Puts the author into the database, unless the same one is there: this object stands for that
    /// one then. Throws `OVException` if the agent cannot do that.
    void _addToDatabase();

    /// 'OVAuthor["name" row]', with the row's ID. Throws as getters of values.
    std::string description() const override;
    bool isEqual(const OVObject* other) const override;
    std::size_t hash() const override;

    OVAuthorInternal& _internal() const { return *mInternal; }

 private:
    friend class OVObjectMaker;
    explicit OVAuthor(std::unique_ptr<OVAuthorInternal> internal);

    std::unique_ptr<OVAuthorInternal> mInternal;
};
