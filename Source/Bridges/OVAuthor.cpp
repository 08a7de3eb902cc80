#include <Orvane/OVAuthor.h>

#include "Bridges/Barriers.h"
#include "Bridges/OVAuthorInternal.h"
#include "Bridges/OVObjectMaker.h"
#include "Bridges/PublicSession.h"
#include "Bridges/PublicValues.h"

#include <Orvane/OVFormat.h>

using namespace Foundation;
using namespace Orvane;

OVAuthor::OVAuthor(std::unique_ptr<OVAuthorInternal> internal) : mInternal(std::move(internal)) {}

OVAuthor::~OVAuthor() = default;

std::shared_ptr<OVAuthor> OVAuthor::create(const Text& name, const Text& email, const Text& URL) {
    constexpr const char* kWhere = "-[OVAuthor initWithName:email:URL:]";
    requireParameter(name || email || URL, kWhere, "name||email||url");
    return raising(kWhere, [&] {
        const Ref<AuthorCore> core = Returner<AuthorCore>::adopted(new AuthorCore);
        core->mName.setValue(stringOf(name).get());
        core->mEmail.setValue(stringOf(email).get());
        core->mURL.setValue(urlOf(URL).get());
        return OVObjectMaker::makeFor<OVAuthor, OVAuthorInternal>(core.get());
    });
}

std::shared_ptr<OVAuthor> OVAuthor::create(const CBPerson* person) {
    requireParameter(person != nullptr, "-[OVAuthor initWithPerson:]", "person");
    return nullptr;
}

OVAuthor::Text OVAuthor::name() const {
    return raising("-[OVAuthor name]", [&] { return textOf(mInternal->core().mName.getValue()); });
}

OVAuthor::Text OVAuthor::email() const {
    return raising("-[OVAuthor email]",
                   [&] { return textOf(mInternal->core().mEmail.getValue()); });
}

OVAuthor::Text OVAuthor::URL() const {
    return raising("-[OVAuthor URL]", [&] { return textOf(mInternal->core().mURL.getValue()); });
}

OVAuthor::Text OVAuthor::nameForDisplay() const {
    for (const Text& text : {name(), email()}) {
        if (text && !text->empty()) return text;
    }
    return URL();
}

OVAuthor::Text OVAuthor::contactBookUID() const {
    return raising("-[OVAuthor contactBookUID]",
                   [&] { return textOf(mInternal->core().mContactBookUID.getValue()); });
}

void OVAuthor::setContactBookUID(const Text& uid) {
    changing("setContactBookUID", [&] {
        const Ref<String> text = stringOf(uid);
        return mInternal->core().public_setContactBookUID(text.get());
    });
}

CBPerson* OVAuthor::person() const {
    return nullptr;
}

void OVAuthor::setPerson(const CBPerson* person) {
    if (person) throw OVException("CBPerson has no unique ID");
    setContactBookUID({});
}

void OVAuthor::_addToDatabase() {
    changing("_addToDatabase", [&] {
        PublicSession::open();
        const Ref<AuthorCore> stored = mInternal->core().addToDatabase();
        if (!stored.get()) return false;
        mInternal->setCore(stored.get(), this);
        return true;
    });
}

std::string OVAuthor::description() const {
    return raising("-[OVAuthor description]", [&] {
        const AuthorCore& core = mInternal->core();
        return OVFormat("%s[\"%@\" %qi]", "OVAuthor", core.mName.getValue(), core.getRowID());
    });
}

bool OVAuthor::isEqual(const OVObject* other) const {
    const auto* author = dynamic_cast<const OVAuthor*>(other);
    return author && IsEqual(mInternal->peek(), author->mInternal->peek());
}

std::size_t OVAuthor::hash() const {
    return mInternal->peek()->getPFHashCode();
}
