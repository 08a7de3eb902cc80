#include "Net/KeyringCredentialStore.h"

#include "Foundation/AbstractTimer.h"
#include "Foundation/Guard.h"
#include "Foundation/Logger.h"
#include "Foundation/PublicErrors.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"
#include "Net/ProtectionSpace.h"

#include <gio/gio.h>
#include <libsecret/secret.h>

#include <cstdlib>
#include <functional>
#include <memory>
#include <string>
#include <utility>

namespace Orvane {

using Foundation::callGuarded;
using Foundation::gWarn;
using Foundation::NetError;
using Foundation::Ref;
using Foundation::String;

namespace {

template <class T>
struct Unref {
    void operator()(T* object) const { g_object_unref(object); }
};
template <class T>
using GRef = std::unique_ptr<T, Unref<T>>;

struct ErrorFree {
    void operator()(GError* error) const { g_error_free(error); }
};
using GErrorRef = std::unique_ptr<GError, ErrorFree>;

struct TableUnref {
    void operator()(GHashTable* table) const { g_hash_table_unref(table); }
};
using Attributes = std::unique_ptr<GHashTable, TableUnref>;

/// The schema that all programs of the desktop use for logins at servers.
const SecretSchema* schema() {
    return SECRET_SCHEMA_COMPAT_NETWORK;
}

void add(const Attributes& attributes, const char* name, const std::string& value) {
    g_hash_table_insert(attributes.get(), g_strdup(name), g_strdup(value.c_str()));
}

Attributes attributesOf(const Origin& origin, const String* user) {
    Attributes attributes(g_hash_table_new_full(g_str_hash, g_str_equal, g_free, g_free));
    add(attributes, "protocol", origin.scheme);
    add(attributes, "server", origin.host);
    add(attributes, "port", std::to_string(origin.port));
    add(attributes, "user", std::string(String::view(user)));
    return attributes;
}

bool isInFile() {
    const char* backend = std::getenv("SECRET_BACKEND");
    return backend && std::string(backend) == "file";
}

using Step = std::function<void()>;

void gotBus(GObject*, GAsyncResult* result, gpointer data) {
    const std::unique_ptr<Step> next(static_cast<Step*>(data));
    const GRef<GDBusConnection> bus(g_bus_get_finish(result, nullptr));
    // GIO would end the process together with the bus.
    if (bus) g_dbus_connection_set_exit_on_close(bus.get(), FALSE);
    callGuarded("void Orvane::KeyringCredentialStore::gotBus()", *next);
}

/// Goes on once the library may use the bus, or it is known that there is none.
void whenReady(Step next) {
    if (isInFile()) return next();
    g_bus_get(G_BUS_TYPE_SESSION, nullptr, gotBus,
              std::make_unique<Step>(std::move(next)).release());
}

/// A look-up. It owns itself until the library has answered, in whatever way.
class LookUp : private Foundation::AbstractTimer {
 public:
    LookUp(Attributes attributes, CredentialStore::PasswordHandler found)
        : mAttributes(std::move(attributes)),
          mFound(std::move(found)),
          mCancellable(g_cancellable_new()) {
        start(KeyringCredentialStore::kLookUpSeconds, false);
    }

    void ask() {
        // The secrets of what is not locked; to unlock would be to ask the user.
        constexpr auto kFlags = SECRET_SEARCH_LOAD_SECRETS;
        secret_password_searchv(schema(), mAttributes.get(), kFlags, mCancellable.get(), answered,
                                this);
    }

 private:
    void fire() override {
        gWarn.log("The keyring does not answer");
        g_cancellable_cancel(mCancellable.get());
        tell(nullptr);
    }

    static void answered(GObject*, GAsyncResult* result, gpointer data) {
        const std::unique_ptr<LookUp> self(static_cast<LookUp*>(data));
        callGuarded("void Orvane::KeyringCredentialStore::answered()",
                    [&] { self->gotItems(result); });
    }

    void gotItems(GAsyncResult* result) {
        GError* error = nullptr;
        GList* items = secret_password_search_finish(result, &error);
        const GErrorRef failure(error);
        if (failure && mFound) gWarn.log("No password from the keyring: %s", failure->message);
        const Ref<String> password = items ? secretOf(items->data) : Ref<String>();
        g_list_free_full(items, g_object_unref);
        tell(password);
    }

    static Ref<String> secretOf(gpointer item) {
        SecretValue* value = SECRET_IS_ITEM(item) ? secret_item_get_secret(SECRET_ITEM(item))
                                                  // Of the file, which is in memory.
                                                  : secret_retrievable_retrieve_secret_sync(
                                                        SECRET_RETRIEVABLE(item), nullptr, nullptr);
        if (!value) return nullptr;
        gsize length = 0;
        const char* text = secret_value_get(value, &length);
        Ref<String> password = String::string(std::string(text, length));
        secret_value_unref(value);
        return password;
    }

    void tell(String* password) {
        stop();
        if (const auto found = std::exchange(mFound, nullptr)) found(password);
    }

    Attributes mAttributes;
    CredentialStore::PasswordHandler mFound;  ///< null once it was called
    GRef<GCancellable> mCancellable;
};

void warnOf(GError* error) {
    const GErrorRef failure(error);
    if (failure) gWarn.log("The keyring has not kept a password: %s", failure->message);
}

void stored(GObject*, GAsyncResult* result, gpointer) {
    GError* error = nullptr;
    secret_password_store_finish(result, &error);
    warnOf(error);
}

void cleared(GObject*, GAsyncResult* result, gpointer) {
    GError* error = nullptr;
    secret_password_clear_finish(result, &error);
    warnOf(error);
}

}  // namespace

NetError KeyringCredentialStore::saveInternetPassword(Foundation::URL* url, String* user,
                                                      String* password) {
    const Origin origin = url ? Origin::of(*url) : Origin();
    if (origin.host.empty()) return {NetError::kPFURL, OVURLErrorBadURL};
    const std::shared_ptr<GHashTable> attributes = attributesOf(origin, user);
    if (!password) {
        whenReady([attributes] {
            secret_password_clearv(schema(), attributes.get(), nullptr, cleared, nullptr);
        });
        return NetError::None;
    }
    const std::string label = OVFormat("%@ at %s", user, origin.host);
    whenReady([attributes, label, text = password->utf8()] {
        secret_password_storev(schema(), attributes.get(), SECRET_COLLECTION_DEFAULT, label.c_str(),
                               text.c_str(), nullptr, stored, nullptr);
    });
    return NetError::None;
}

void KeyringCredentialStore::findInternetPassword(Foundation::URL* url, String* user,
                                                  PasswordHandler found) {
    const Origin origin = url ? Origin::of(*url) : Origin();
    if (origin.host.empty()) return found(nullptr);
    auto lookUp = std::make_unique<LookUp>(attributesOf(origin, user), std::move(found));
    whenReady([owned = lookUp.release()] { owned->ask(); });
}

}  // namespace Orvane
