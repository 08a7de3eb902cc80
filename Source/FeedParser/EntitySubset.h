#pragma once

#include "Foundation/Uncopyable.h"

struct _xmlDoc;
struct _xmlDtd;
struct _xmlNode;

namespace Orvane::FeedParser {

/// The character entities of HTML 4.01 as an external DTD subset, which one document at a time has.
/// It is what lets a feed say "&eacute;" without a DOCTYPE. Lives as long as the process.
class EntitySubset : Foundation::Uncopyable {
 public:
    static EntitySubset& shared();

    /// Becomes the document's external subset. One that the document has already is freed.
    void attachTo(_xmlDoc* document);
    /// Leaves the document, which may be null, if it is there.
    void detachFrom(_xmlDoc* document);

    /// While it lives, the next document that libxml2 makes on this thread gets the subset at once:
    /// the reader parses further than its first element before it hands that over.
    class NextDocument : Foundation::Uncopyable {
     public:
        NextDocument();
        /// Takes the subset out of the document again.
        ~NextDocument();

        /// Null until there is one.
        _xmlDoc* document() const { return mDocument; }
        /// The document is about to be freed, without the subset.
        void release();

     private:
        static void nodeMade(_xmlNode* node) noexcept;
        static thread_local NextDocument* sCurrent;

        _xmlDoc* mDocument = nullptr;
    };

 private:
    EntitySubset();
    void add(const char* name, unsigned character);

    _xmlDoc* mScratch;  ///< the document of the entities' own nodes
    _xmlDtd* mSubset;
};

}  // namespace Orvane::FeedParser
