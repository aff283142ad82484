#ifndef KX_BENCH_DOCUMENTS_H
#define KX_BENCH_DOCUMENTS_H

// The documents that the benchmarks work on and the names of the workloads, which all
// implementations share. Each document is written when it is first asked for, and is removed when
// the program ends.

#include <cstddef>
#include <string>
#include <vector>

namespace bench
{

/** A value to read right after loading. */
struct FirstRead
{
    std::string workload;
    std::string path;
    std::string root;
    std::vector<std::string> names; ///< below the root
    std::string attribute;          ///< that narrows the first level; empty: none
    std::string attributeValue;
    std::string xpath; ///< the same as an expression
    std::string value;
    bool firstWillDo; ///< whether the value lies under the first element of each name; if not,
                      ///< libraries that step down by name would not find it
};

/** Generated configurations of several sizes, and those real files that this machine has. */
const std::vector<FirstRead>& FirstReads();

/** A root "cfg" with @p count children, of which only the last is called "service". */
std::string Siblings(std::size_t count);
const char* const kServiceValue = "on";

/** A root "cfg" with @p count items; each has its number as attribute "id" and a "name" in it. */
std::string Items(std::size_t count);
std::string ItemName(std::size_t id);

/** A root "cfg" with @p count elements "item", each with a text. */
std::string Texts(std::size_t count);
/** The texts of Texts(), separated by newlines. */
std::string AllTexts(std::size_t count);

/** Below the root "cfg" @p levels levels, each with an element of another name first. */
std::string Nested(std::size_t levels);
std::vector<std::string> NestedNames(std::size_t levels);
const char* const kNestedValue = "deep";

/** A root "cfg" with a single "item" that has the attributes of TermName() and a "name" in it. */
std::string Attributed();
std::string TermName(std::size_t term);
std::string TermValue(std::size_t term);
const char* const kAttributedValue = "chosen";

/** A root "cfg" with a single "item" that has the first four attributes of TermName(). */
std::string FourAttributes();
const std::size_t kFourAttributes = 4;

/** A root "cfg" with @p count channels of a few elements each, and an element "label" at last. */
std::string Channels(std::size_t count);
const std::size_t kUpdatedChannels = 1000;

/** A path in the same folder that no document has. */
std::string ScratchFile(const std::string& name);

/** @return whether the file holds the channels with "after" in the element "label". */
bool IsUpdated(const std::string& path);

const std::vector<std::size_t> kSiblingCounts = {1, 10, 1000, 100000};
const std::vector<std::size_t> kItemCounts = {10, 1000, 100000};
const std::vector<std::size_t> kTextCounts = {1, 100, 10000};
const std::vector<std::size_t> kDepths = {2, 3, 4, 5, 6};

// Points of the growth curves beyond those above.
const std::vector<std::size_t> kMoreSiblingCounts = {100, 10000, 1000000};
const std::vector<std::size_t> kMoreItemCounts = {100, 10000, 1000000};
const std::vector<std::size_t> kMoreTextCounts = {10, 1000, 100000};
const std::vector<std::size_t> kMoreDepths = {10, 25, 50, 100, 250};
const std::vector<std::size_t> kTermCounts = {1, 10, 100, 1000, 10000};

std::vector<std::size_t> Joined(std::vector<std::size_t> first,
                                const std::vector<std::size_t>& second);

std::string Sized(const std::string& workload, std::size_t size);

const char* const kLookUpPlain = "look up, match at sibling";
const char* const kLookUpCondition = "look up with a condition, match at sibling";
const char* const kLookUpTexts = "look up, values collected";
const char* const kLookUpDepth = "look up, levels";
const char* const kLookUpAndTerms = "look up with a condition, terms joined by &";
const char* const kLookUpOrTerms = "look up with a condition, terms joined by |";
const char* const kUpdate = "update one value in a document of 100 KB";
const char* const kUpdateAndSave = "update one value in a document of 100 KB and save";

const char* const kUpdateCondition = "update with a condition, match at sibling";
const std::size_t kUpdatedItems = 1000;

const char* const kIterate = "iterate over 10000 children";
const char* const kListChildren = "list 10000 children";
const std::size_t kIteratedChildren = 10000;
const char* const kFindChild = "find a child by name, match at sibling";
const std::vector<std::size_t> kFindChildCounts = {10, 1000, 100000};
const char* const kListAttributes = "list four attributes";

/** An XPath query: a name that many elements bear, or a selection among many. */
struct Query
{
    const char* workload;
    std::size_t channels;
    const char* expression;
    double below; ///< the number that a "limit" has to be below; 0: any will do
};
const std::size_t kQueryHits = 200;
const Query kQueries[] = {
    {"find 200 nodes by XPath, by name", kQueryHits, "//limit", 0},
    {"find 200 nodes by XPath, among 1000 by value", 1000, "//limit[. < 4]", 4}};

// The implementations.
const char* const kLibrary = "this library";
const char* const kLibraryReturning = "this library, value returned";
const char* const kWalk = "hand-written walk"; // or whatever else one would write by hand
const char* const kWalkInPlace = "hand-written walk, in place"; // attributes not copied
const char* const kXPathFresh = "XPath, fresh";
const char* const kXPathCompiled = "XPath, compiled";
const char* const kXPathListed = "XPath, fresh, into a list";

} // namespace bench

#endif
