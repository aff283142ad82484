#ifndef KX_TESTS_SUPPORT_ENGINE_H
#define KX_TESTS_SUPPORT_ENGINE_H

// What the library asks of the engine: the test program stands in front of some engine calls,
// notes them and passes them on.

#include <libxml/tree.h>
#include <libxml/xpath.h>

#include <cstddef>
#include <string>
#include <vector>

namespace kxtest
{

/** Notes engine calls from construction to destruction. */
class EngineCalls
{
public:
    EngineCalls();
    ~EngineCalls();
    EngineCalls(const EngineCalls&) = delete;
    EngineCalls& operator=(const EngineCalls&) = delete;

    /** @return how often xmlFreeDoc was called for @p document, null included. */
    std::size_t Freed(const void* document) const;

    /** @return how often xmlFreeDoc was called. */
    std::size_t Frees() const;

    /** @return the paths given to xmlParseFile. */
    const std::vector<std::string>& Parsed() const;

    /** @return the names given to xmlGetProp. */
    const std::vector<std::string>& PropertiesRead() const;

    /**
     * From now on xmlParseFile, xmlFreeDoc, xmlCleanupParser and xmlSaveFileEnc stand among the
     * records of the log.
     */
    void ShowAmongRecords();

    /** Makes xmlSaveFileEnc save nothing and answer with @p result, as long as the object lives. */
    void AnswerSavesWith(int result);

    /** @return the arguments of each call of xmlSaveFormatFileEnc: "path encoding format". */
    const std::vector<std::string>& FormatSaves() const;

    /** @return the arguments of each call of xmlKeepBlanksDefault. */
    const std::vector<int>& BlanksDefaults() const;

    /** @return how often xmlCleanupParser was called. */
    std::size_t Cleanups() const;

    /** @return contexts made by xmlXPathNewContext less those freed. */
    long LiveContexts() const;
};

/** @return the version of the running engine, 20914 for 2.9.14; LIBXML_VERSION is the headers'. */
int EngineVersion();

/** Makes the engine report @p version to the library, 2.14 and later engines excepted; null ends
 * it. */
void AnswerVersion(const char* version);

/** Makes the engine report a version to the library, as AnswerVersion does, while it lives. */
class PretendedVersion
{
public:
    explicit PretendedVersion(const char* version) { AnswerVersion(version); }
    ~PretendedVersion() { AnswerVersion(nullptr); }
    PretendedVersion(const PretendedVersion&) = delete;
    PretendedVersion& operator=(const PretendedVersion&) = delete;
};

/** @return the steps to which the library limited the last evaluation of XPath; 0 for no limit. */
unsigned long LastStepLimit();

/** Lowers each limit that the library sets from now on, which takes seconds; 0 ends it. */
void LowerStepLimits(unsigned long steps);

/** Makes the next call of xmlSaveFormatFileEnc do nothing and answer @p result. */
void AnswerNextFormatSave(int result);

/** Makes the next call of xmlXPathNewContext do nothing and answer null. */
void RefuseNextXPathContext();

/** Makes the next call of xmlXPathEvalExpression do nothing and answer @p result. */
void AnswerNextXPath(xmlXPathObjectPtr result);

/** Makes the next call of xmlParseFile parse nothing and answer @p document. */
void AnswerNextParse(xmlDocPtr document);

/** @return what xmlXPathEvalExpression answered last; possibly freed since. */
xmlXPathObjectPtr LastXPath();

/** Makes the next call of xmlAddSibling do nothing and answer null. */
void RefuseNextSibling();

/** Parses a document from memory, blanks kept; the caller frees it. */
xmlDocPtr ParseText(const std::string& xml);

/** @return the text that the engine saves for @p document: encoding UTF-8, without formatting. */
std::string Serialized(xmlDocPtr document);

/** @return the engine's complaints about the last parse, collected instead of printed. */
std::string TakeEngineErrors();

/** Called by main(): collects the engine's complaints. */
void CollectEngineErrors();

} // namespace kxtest

#endif
