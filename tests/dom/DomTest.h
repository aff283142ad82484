#ifndef KX_TESTS_DOM_DOMTEST_H
#define KX_TESTS_DOM_DOMTEST_H

#include "CXmlNode.h"

#include "support/Engine.h"
#include "support/Expect.h"
#include "support/Files.h"
#include "support/Log.h"
#include "support/Memory.h"

#include <gtest/gtest.h>

#include <libxml/parserInternals.h>

#include <list>
#include <string>
#include <vector>

namespace kxtest
{

// What handles log on their way.
const Records kMade = Traced("CXmlNode");
const Records kSet = Traced("SetXmlNodePtr");
const Records kGone = Traced("~CXmlNode");
const Records kFound = kMade + kSet;     ///< a result handle that designates a node
const Records kAppended = kMade + kGone; ///< an entry of a node list

// The engine's names for nodes without one of their own.
const char* const kTextName = reinterpret_cast<const char*>(xmlStringText);
const char* const kCommentName = reinterpret_cast<const char*>(xmlStringComment);

/** Names of the nodes, in order. */
std::vector<std::string> Names(std::list<CXmlNode> nodes);

/** @return a document with a root element named @p root and without a dictionary, which grows. */
xmlDocPtr NewDocument(const char* root);

/**
 * @return whether @p node is @p document or a node or attribute in it, wherever it hangs. Only the
 *         pointer is looked at: the node may have been freed.
 */
bool IsIn(xmlDocPtr document, const void* node);

/** @return the attributes that the engine's table of IDs points to. */
std::vector<const void*> IdsOf(xmlDocPtr document);

/** Every attribute in the table of IDs is in the document. */
void ExpectSoundIds(xmlDocPtr document);

/** One document that the suite talks about, and helpers to look at it past the library. */
class DomTest : public testing::Test
{
protected:
    DomTest();
    ~DomTest() override;

    /** @return @p xml, parsed with its blanks; freed at the end of the test. */
    xmlDocPtr Parse(const std::string& xml);

    /** @return the first node of @p document, or of the suite's document, that @p xpath selects. */
    static xmlNodePtr NodeOf(xmlDocPtr document, const std::string& xpath);
    xmlNodePtr Node(const std::string& xpath) const { return NodeOf(m_document, xpath); }

    /** @return the root element of the suite's document, as the engine saves it. */
    std::string Text() const { return TextOf(Node("/*")); }
    static std::string TextOf(xmlNodePtr node);

    /**
     * The root cfg with: a text piece; a comment; the element name (text "box"); a text piece; the
     * element net (attributes id="1" and mode="on") with two port elements ("1", "2"), an element
     * Port and an empty element; a processing instruction; the empty element last.
     */
    const xmlDocPtr m_document;

private:
    std::vector<xmlDocPtr> m_parsed;
};

} // namespace kxtest

#endif
