// Prints how the running engine behaves where versions differ: its version, then for each behavior
// a line with its name, a tab and the answer. The names are those of the table in
// docs/handbook/engine-versions.md. All calls are the engine's own, without the library.

#include "support/Files.h"

#include <libxml/parser.h>
#include <libxml/xmlsave.h>
#include <libxml/xpath.h>

#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <iostream>
#include <string>

using kxtest::TemporaryFolder;

namespace
{

const char* const kGzip =
    "\x1f\x8b\x08\x00\x00\x00\x00\x00\x02\x03\xb3\x49\x4e\x4b\xb7\xb3\x49\xb4"
    "\x2b\xb3\xd1\x4f\xb4\xb3\xd1\x07\xf1\x00\xc5\x27\x99\xff\x13\x00\x00\x00";
const std::size_t kGzipSize = 36;

const xmlChar* X(const char* text)
{
    return reinterpret_cast<const xmlChar*>(text);
}

void PrintNothing(void*, const char*, ...)
{
}

xmlDoc* Parse(const std::string& xml)
{
    return xmlReadMemory(xml.data(), static_cast<int>(xml.size()), "memory.xml", nullptr, 0);
}

xmlNode* Root(const std::string& xml)
{
    return xmlDocGetRootElement(Parse(xml));
}

/** @return the element as the engine saves it. */
std::string Saved(xmlNode* element)
{
    xmlBuffer* const buffer = xmlBufferCreate();
    xmlNodeDump(buffer, element->doc, element, 0, 0);
    return reinterpret_cast<const char*>(xmlBufferContent(buffer));
}

/** @return the answer of @p probe in a process of its own, or what became of that. */
std::string InAProcess(const std::function<std::string()>& probe)
{
    int ends[2];
    if (pipe(ends) != 0)
    {
        return "no pipe";
    }
    const pid_t child = fork();
    if (child == 0)
    {
        const rlimit seconds = {2, 2}; // of processor time: the longest answer needs less than one
        const rlimit core = {0, 0};
        setrlimit(RLIMIT_CPU, &seconds);
        setrlimit(RLIMIT_CORE, &core);
        const std::string answer = probe();
        _exit(write(ends[1], answer.data(), answer.size()) < 0 ? 1 : 0);
    }
    close(ends[1]);
    char text[200];
    const ssize_t size = read(ends[0], text, sizeof text);
    close(ends[0]);
    int status = 0;
    waitpid(child, &status, 0);
    if (WIFSIGNALED(status))
    {
        return WTERMSIG(status) == SIGXCPU || WTERMSIG(status) == SIGKILL ? "does not end"
                                                                          : "ends the process";
    }
    return std::string(text, static_cast<std::size_t>(size));
}

// --- Files

std::string CompressedFile()
{
    const TemporaryFolder folder;
    return xmlParseFile(folder.Write("a.xml", std::string(kGzip, kGzipSize)).c_str()) != nullptr
               ? "is read"
               : "is not parsed";
}

std::string EscapeInAPathToRead()
{
    const TemporaryFolder folder;
    folder.Write("a b.xml", "<a/>");
    return xmlParseFile(folder.Path("a%20b.xml").c_str()) != nullptr ? "is decoded" : "is literal";
}

std::string EscapeInAPathToWrite()
{
    const TemporaryFolder folder;
    xmlSaveFormatFileEnc(folder.Path("a%20b.xml").c_str(), Parse("<a/>"), "UTF-8", 0);
    return access(folder.Path("a b.xml").c_str(), F_OK) == 0 ? "is decoded" : "is literal";
}

std::string SaveToAFullDisk()
{
    const std::string xml = "<a>" + std::string(100000, 'x') + "</a>";
    const int result = xmlSaveFormatFileEnc("/dev/full", Parse(xml), "UTF-8", 0);
    return result == -1 ? "-1" : result < -1 ? "below -1" : "success";
}

std::string ParameterEntity()
{
    const TemporaryFolder folder;
    const std::string dtd = folder.Write("a.dtd", "<!ENTITY e 'text'>");
    const std::string xml = "<!DOCTYPE a [<!ENTITY % p SYSTEM '" + dtd + "'> %p;]><a/>";
    xmlDoc* const document = xmlParseFile(folder.Write("a.xml", xml).c_str());
    return xmlGetDocEntity(document, X("e")) != nullptr ? "is read" : "is not read";
}

// --- Parsing and saving

std::string UndeclaredPrefix()
{
    return Saved(Root("<p:a/>")) == "<p:a/>" ? "is kept" : "is dropped";
}

std::string Levels()
{
    std::size_t levels = 250;
    std::string xml;
    do
    {
        ++levels;
        xml.clear();
        for (std::size_t level = 0; level != levels; ++level)
        {
            xml = "<a>" + xml + "</a>";
        }
    } while (levels != 300 && Parse(xml) != nullptr);
    return std::to_string(levels - 1);
}

std::string ControlCharacter()
{
    xmlNode* const root = Root("<a/>");
    xmlAddChild(root, xmlNewText(X("\x01")));
    const std::string text = Saved(root);
    return text == "<a>\x01</a>"           ? "is unchanged"
           : text == "<a>\xEF\xBF\xBD</a>" ? "is U+FFFD"
           : text == "<a>&#xFFFD;</a>"     ? "is U+FFFD"
           : text == "<a>&#1;</a>"         ? "is `&#1;`"
                                           : text;
}

bool KeepsBlanks()
{
    return Root("<a> <b/></a>")->children->type == XML_TEXT_NODE;
}

std::string BlanksAfterCleanup()
{
    xmlKeepBlanksDefault(0);
    xmlCleanupParser();
    return KeepsBlanks() ? "is reset" : "stays";
}

// --- Content

std::string EmptyContent()
{
    xmlNode* const root = Root("<a>old</a>");
    xmlNodeSetContent(root, X(""));
    return root->children == nullptr ? "leaves no child" : "leaves an empty text";
}

std::string BareAmpersand()
{
    xmlNode* const root = Root("<a>old</a>");
    xmlNodeSetContent(root, X("a&b"));
    return "`" + Saved(root) + "`";
}

std::string EntityInItself()
{
    xmlNode* const root = Root("<!DOCTYPE a [<!ENTITY e 'x&e;'>]><a/>");
    xmlNodeSetContent(root, X("&e;"));
    return Saved(root) == "<a>&e;</a>" ? "is stored" : "is not stored";
}

int g_untilFailure = 0;

void* FailingMalloc(std::size_t size)
{
    return --g_untilFailure == 0 ? nullptr : std::malloc(size);
}

void* FailingRealloc(void* memory, std::size_t size)
{
    return --g_untilFailure == 0 ? nullptr : std::realloc(memory, size);
}

std::string ContentShortOfMemory()
{
    for (int n = 1; n != 10; ++n)
    {
        xmlNode* const root = Root("<a b='old'/>");
        xmlMemSetup(std::free, FailingMalloc, FailingRealloc, strdup);
        g_untilFailure = n;
        xmlNodeSetContent(reinterpret_cast<xmlNode*>(root->properties), X("text"));
        g_untilFailure = 0;
    }
    return "is survived";
}

// --- XPath

/** @return whether the query from @p node succeeds. */
std::string Query(const char* expression, xmlNode* node)
{
    xmlXPathContext* const context = xmlXPathNewContext(node->doc);
    context->node = node;
    return xmlXPathEvalExpression(X(expression), context) != nullptr ? "succeeds" : "fails";
}

std::string AncestorsInAnAttribute()
{
    return Query("ancestor::*", Root("<a b='text'/>")->properties->children);
}

/** @return the answer from the first child of a root whose second child refers to the entity e. */
std::string QueryPastAReference(const char* expression, const char* declarations)
{
    const std::string type = std::string("<!DOCTYPE a [") + declarations + "]>";
    return Query(expression, Root(type + "<a><b/>&e;<c/></a>")->children);
}

// The reference leads into the declaration, and the declaration's siblings to the root.
std::string NodesBehindAReference()
{
    return QueryPastAReference("following::*", "<!ENTITY e 'x'><!ELEMENT a ANY>");
}

std::string NothingBehindAReference()
{
    return QueryPastAReference("following::d", "<!ENTITY e 'x'><!ELEMENT a ANY>");
}

std::string NothingBeforeALaterEntity()
{
    return QueryPastAReference("../c/preceding::d", "<!ENTITY e 'x&f;'><!ENTITY f 'y'>");
}

std::string TextOfAnEntityInItself()
{
    xmlNode* const root = Root("<!DOCTYPE a [<!ENTITY e 'x&e;'>]><a/>");
    xmlNodeSetContent(root, X("&e;"));
    return Query("string(.)", root);
}

std::string NestedParentheses()
{
    const std::string deep = std::string(100000, '(') + "1" + std::string(100000, ')');
    return Query(deep.c_str(), Root("<a/>"));
}

std::string CommentInADtd()
{
    xmlXPathContext* const context = xmlXPathNewContext(Parse("<!DOCTYPE a [<!--c-->]><a/>"));
    xmlXPathObject* const found = xmlXPathEvalExpression(X("//comment()"), context);
    return xmlXPathNodeSetIsEmpty(found->nodesetval) ? "is not found" : "is found";
}

struct Behavior
{
    const char* name;
    std::string (*probe)();
};

const Behavior kBehaviors[] = {
    {"a file compressed by gzip", CompressedFile},
    {"`%20` in a path to be read", EscapeInAPathToRead},
    {"`%20` in a path to be written", EscapeInAPathToWrite},
    {"result of a save to a full disk", SaveToAFullDisk},
    {"the file of a parameter entity", ParameterEntity},
    {"an undeclared prefix", UndeclaredPrefix},
    {"permitted levels of elements", Levels},
    {"a control character, saved", ControlCharacter},
    {"keep-blanks after `xmlCleanupParser`", BlanksAfterCleanup},
    {"`xmlNodeSetContent` of an empty text", EmptyContent},
    {"`xmlNodeSetContent` of `a&b`", BareAmpersand},
    {"`xmlNodeSetContent` of an entity that contains itself", EntityInItself},
    {"`xmlNodeSetContent` of an attribute, short of memory", ContentShortOfMemory},
    {"`ancestor` inside an attribute", AncestorsInAnAttribute},
    {"`following` past a reference", NodesBehindAReference},
    {"`following` past a reference, to no node", NothingBehindAReference},
    {"`preceding` past a later entity, to no node", NothingBeforeALaterEntity},
    {"`string()` of an entity that contains itself", TextOfAnEntityInItself},
    {"100,000 nested parentheses", NestedParentheses},
    {"`//comment()` of a comment in a DTD", CommentInADtd},
};

/** @return "2.9.14" for 20914. */
std::string Version()
{
    const long number = std::strtol(xmlParserVersion, nullptr, 10);
    return std::to_string(number / 10000) + "." + std::to_string(number / 100 % 100) + "." +
           std::to_string(number % 100);
}

} // namespace

int main()
{
    xmlSetGenericErrorFunc(nullptr, PrintNothing);
    std::cout << Version() << std::endl;
    for (const Behavior& behavior : kBehaviors)
    {
        std::cout << behavior.name << '\t' << InAProcess(behavior.probe) << std::endl;
    }
}
