#pragma once

#include "Foundation/Data.h"
#include "Foundation/Ref.h"
#include "Foundation/String.h"
#include "Foundation/URL.h"

#include <string>
#include <string_view>
#include <vector>

namespace Orvane {

struct HTTPHeader {
    std::string name;
    std::string value;
};

/// The head of an HTTP request or response, RFC 9110, and of a request also its body. Names of
/// headers are compared without case. Header values are bytes; those that are no UTF-8 read as
/// ISO 8859-1.
class HTTPMessage : public Foundation::PFRefCounted {
 public:
    /// A request of HTTP/1.1. Throws `AssertionFailure` for null.
    static Foundation::Returner<HTTPMessage> request(Foundation::String* method,
                                                     Foundation::URL* url);
    /// A response.
    static Foundation::Returner<HTTPMessage> response(int status, std::vector<HTTPHeader> headers);
    Foundation::Returner<HTTPMessage> copy() const;

    bool isRequest() const { return mStatus == 0; }
    /// The method of a request; empty for a response.
    const std::string& getMethod() const { return mMethod; }
    void setMethod(std::string method) { mMethod = std::move(method); }
    /// Null for a response.
    Foundation::URL* getURL() const { return mURL; }
    void setURL(Foundation::URL* url) { mURL = url; }
    /// The URL of a request as text for the log, without user and password.
    std::string getPlace() const;
    /// The status of a response; 0 for a request.
    int getStatus() const { return mStatus; }

    /// The values of all headers of that name with ", " between them; null if there is none.
    Foundation::StringReturner getHeader(const Foundation::String* name) const;
    /// The same as bytes; empty if there is none.
    std::string getHeader(std::string_view name) const;
    bool hasHeader(std::string_view name) const;
    /// Puts a header in the place of all of that name; a null value takes them away. Line ends in
    /// the value, which would begin another header, become blanks.
    void setHeader(const Foundation::String* name, const Foundation::String* value);
    void setHeader(std::string_view name, std::string_view value);
    void removeHeader(std::string_view name);
    const std::vector<HTTPHeader>& headers() const { return mHeaders; }

    /// The body of a request; may be null.
    Foundation::Data* getBody() const { return mBody; }
    void setBody(Foundation::Data* body) { mBody = body; }

    /// Whether two names of headers are the same.
    static bool isSameName(std::string_view a, std::string_view b);

 private:
    HTTPMessage() = default;

    std::string mMethod;
    Foundation::Ref<Foundation::URL> mURL;
    int mStatus = 0;
    std::vector<HTTPHeader> mHeaders;
    Foundation::Ref<Foundation::Data> mBody;
};

}  // namespace Orvane
