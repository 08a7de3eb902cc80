#pragma once

#include "Foundation/Ref.h"
#include "Foundation/RefCounted.h"
#include "Foundation/String.h"

namespace Foundation {

/// A media type of RFC 2045, such as "text/html; charset=utf-8". Immutable to the outside: its
/// parts are made when they are asked for.
class MIMEType : public RefCounted {
 public:
    /// The type with a text, which is kept as it stands; null for null.
    static Returner<MIMEType> type(String* text);

    /// Shared by the whole process.
    static MIMEType* textPlain();
    static MIMEType* textHTML();
    static MIMEType* applicationXHTML();
    static MIMEType* applicationOctetStream();

    String* getString() const { return mString; }
    /// The type without its parameters: lower case, cut at the first ";", trimmed.
    String* getBase() const;
    /// What stands before the base's first "/"; all of it if there is none.
    String* getType() const;
    /// What stands behind it; null if there is none.
    String* getSubType() const;

    /// Whether this is of the type that `other` names, which may have "*" for its subtype. False
    /// for null.
    bool isBaseEqual(const MIMEType* other) const;
    /// Whether the base begins with "text/".
    bool isTextType() const;
    /// Whether the base ends with "+xml" or "/xml".
    bool isXMLType() const;

    /// By the text as given.
    std::size_t getPFHashCode() const override;
    bool isEqual(const RefCounted* other) const override;
    StringReturner toString() const override;

 private:
    explicit MIMEType(String* text) : mString(text) {}

    /// Makes `mType` and `mSubType`.
    void parseType() const;

    Ref<String> mString;
    mutable Ref<String> mBase;
    mutable Ref<String> mType;  ///< null until it is asked for
    mutable Ref<String> mSubType;
};

}  // namespace Foundation
