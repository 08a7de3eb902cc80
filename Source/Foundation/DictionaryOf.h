#pragma once

#include "Foundation/Dictionary.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"

#include <concepts>
#include <initializer_list>
#include <string>
#include <string_view>
#include <utility>

namespace Foundation {

/// A dictionary of keys K, a `PFRefCounted`, and values V, a `PFRefCounted` or a `RefCounted`.
/// Holds a reference to each.
template <class K, class V>
class DictionaryOf : public Dictionary {
 public:
    using Iterator = IteratorOf<K, V>;

    /// The entries `{{key, value}, …}`; one with a null value is left out, and a later one replaces
    /// an earlier one of an equal key.
    static Returner<DictionaryOf> dictionary(std::initializer_list<std::pair<K*, V*>> entries) {
        Ref<DictionaryOf> made{Returner<DictionaryOf>(new DictionaryOf)};
        for (const auto& [key, value] : entries) {
            made->setEntry(key, value);
        }
        return Returner<DictionaryOf>(std::move(made));
    }

    /// The value of a key; null if there is none or the key is null.
    V* get(const K* key) const { return valueOf(mTable.find(key)); }
    V* get(std::string_view key) const requires std::same_as<K, String> {
        return valueOf(mTable.find(key));
    }

    Iterator begin() const { return {mTable.entries(), 0}; }
    Iterator end() const { return {mTable.entries(), mTable.entries().size()}; }

 protected:
    DictionaryOf() = default;

 private:
    static V* valueOf(const DictionaryTable::Entry* entry) {
        return entry ? entry->value.template get<V>() : nullptr;
    }
};

/// A dictionary that can be changed. What it gives up is released at once.
template <class K, class V>
class MutableDictionaryOf : public DictionaryOf<K, V> {
 public:
    static Returner<MutableDictionaryOf> dictionary(
        std::initializer_list<std::pair<K*, V*>> entries = {}) {
        Ref<MutableDictionaryOf> made{Returner<MutableDictionaryOf>(new MutableDictionaryOf)};
        for (const auto& [key, value] : entries) {
            made->set(key, value);
        }
        return Returner<MutableDictionaryOf>(std::move(made));
    }

    /// Null as the value removes the key. Throws `AssertionFailure` for a null key.
    void set(K* key, V* value) { this->setEntry(key, value); }
    void set(std::string_view key, V* value) requires std::same_as<K, String> {
        const Ref<String> string = String::string(std::string(key));
        set(string, value);
    }
    /// The same for a value that is handed over; needs no pool.
    template <std::derived_from<V> U>
    void set(K* key, Returner<U> value) {
        const Ref<U> held = std::move(value);
        set(key, static_cast<V*>(held));
    }
    template <std::derived_from<V> U>
    void set(std::string_view key, Returner<U> value) requires std::same_as<K, String> {
        const Ref<U> held = std::move(value);
        set(key, static_cast<V*>(held));
    }
    void remove(const K* key) { this->mTable.remove(key); }
    void removeAll() { this->mTable.clear(); }

 private:
    MutableDictionaryOf() = default;
};

/// What property lists, the infos of notifications and settings are.
using MutableDictionary = MutableDictionaryOf<String, PFRefCounted>;

}  // namespace Foundation
