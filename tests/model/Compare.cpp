#include "model/Compare.h"

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include "model/MemoryFile.h"
#include "model/Model.h"
#include "model/Nodes.h"

#include <libxml/parser.h>

#include <memory>
#include <sstream>
#include <vector>

using namespace kxtest;

namespace kxmodel
{

namespace
{

struct FreeDocument
{
    void operator()(xmlDocPtr document) const { xmlFreeDoc(document); }
};
using Document = std::unique_ptr<xmlDoc, FreeDocument>;

bool SameText(const xmlChar* left, const xmlChar* right)
{
    return (left == nullptr) == (right == nullptr) && xmlStrEqual(left, right) != 0;
}

bool SameNamespace(const xmlNs* left, const xmlNs* right)
{
    return left == nullptr || right == nullptr
               ? left == right
               : SameText(left->prefix, right->prefix) && SameText(left->href, right->href);
}

bool SameNodes(const xmlNode* left, const xmlNode* right);

bool SameElements(const xmlNode* left, const xmlNode* right)
{
    return SameNamespace(left->ns, right->ns) &&
           SameNodes(reinterpret_cast<const xmlNode*>(left->properties),
                     reinterpret_cast<const xmlNode*>(right->properties)) &&
           SameNodes(left->children, right->children);
}

bool SameNode(const xmlNode* left, const xmlNode* right)
{
    if (left->type != right->type || !SameText(left->name, right->name))
    {
        return false;
    }
    switch (left->type)
    {
    case XML_ELEMENT_NODE:
        return SameElements(left, right);
    case XML_ATTRIBUTE_NODE:
        return SameNamespace(left->ns, right->ns) && SameNodes(left->children, right->children);
    case XML_TEXT_NODE:
    case XML_CDATA_SECTION_NODE:
    case XML_COMMENT_NODE:
    case XML_PI_NODE:
        return SameText(left->content, right->content);
    default:
        return true; // references and declarations: no call changes what is behind them
    }
}

/** Compares two chains of siblings with all that is below them. */
bool SameNodes(const xmlNode* left, const xmlNode* right)
{
    for (; left != nullptr && right != nullptr; left = left->next, right = right->next)
    {
        if (!SameNode(left, right))
        {
            return false;
        }
    }
    return left == right;
}

xmlNodePtr StartOf(const Operation& operation, xmlDocPtr document)
{
    const std::vector<xmlNodePtr> nodes = NodesOf(document);
    return nodes[operation.node % nodes.size()];
}

/** What a call leaves behind. */
struct Answer
{
    int status = 0;
    unsigned flag = 0;
    std::string text; ///< of a lookup
    Records records;
};

bool operator==(const Answer& left, const Answer& right)
{
    return left.status == right.status && left.flag == right.flag && left.text == right.text &&
           left.records == right.records;
}

std::ostream& operator<<(std::ostream& out, const Answer& answer)
{
    out << "status " << answer.status << ", flag " << answer.flag << ", text \"" << answer.text
        << "\", records:";
    for (const Record& record : answer.records)
    {
        out << record;
    }
    return out << '\n';
}

constexpr unsigned kFlagBefore = 7; // neither of the values that a call may leave in a flag

/** The store as a client meets it: a reader that owns the document, a writer that works on it. */
class Library
{
public:
    explicit Library(const std::string& path) : m_reader(path)
    {
        Reshape(GetDocument());
        m_writer.SetDataPtr(GetDocument());
    }
    ~Library() { m_writer.SetDataPtr(nullptr); }
    Library(const Library&) = delete;
    Library& operator=(const Library&) = delete;

    xmlDocPtr GetDocument() { return static_cast<xmlDocPtr>(m_reader.GetDataPtr()); }

    Answer Perform(const Operation& operation)
    {
        Answer answer;
        answer.flag = kFlagBefore;
        const xmlNodePtr node = StartOf(operation, GetDocument());
        std::string value = operation.value;
        LogRecorder log(operation.mask);
        switch (operation.call)
        {
        case Call::Get:
            answer.text = m_reader.GetValue(operation.key);
            break;
        case Call::GetInto:
            answer.status = m_reader.GetValue(operation.key, value);
            answer.text = value;
            break;
        case Call::GetInPlace:
            value = operation.key;
            answer.status = m_reader.GetValue(value, value);
            answer.text = value;
            break;
        case Call::Collect:
            answer.text = m_reader.XMLGetValue(node, operation.key);
            break;
        case Call::Append:
            answer.status = m_reader.XMLGetValue(node, operation.key, value, answer.flag);
            answer.text = value;
            break;
        case Call::Set:
            answer.status = m_writer.SetValue(operation.key, value);
            break;
        case Call::Update:
            answer.status = m_writer.XMLSetValue(node, operation.key, value, answer.flag);
            answer.text = value;
            break;
        }
        answer.records = log.Take();
        return answer;
    }

private:
    CXMLReader m_reader;
    CXMLWriter m_writer;
};

Answer Expected(Model& model, xmlDocPtr document, const Operation& operation)
{
    Answer answer;
    answer.flag = kFlagBefore;
    const xmlNodePtr node = StartOf(operation, document);
    switch (operation.call)
    {
    case Call::Get:
        answer.text = model.GetValue(operation.key);
        break;
    case Call::GetInto:
        answer.text = operation.value;
        answer.status = model.GetValue(operation.key, answer.text);
        break;
    case Call::GetInPlace:
        answer.text = operation.key;
        answer.status = model.GetValue(operation.key, answer.text);
        break;
    case Call::Collect:
        answer.text = model.XMLGetValue(node, operation.key);
        break;
    case Call::Append:
        answer.text = operation.value;
        answer.status = model.XMLGetValue(node, operation.key, answer.text, answer.flag);
        break;
    case Call::Set:
        answer.status = model.SetValue(operation.key, operation.value);
        break;
    case Call::Update:
        answer.text = operation.value;
        answer.status = model.XMLSetValue(node, operation.key, operation.value, answer.flag);
        break;
    }
    answer.records = Under(operation.mask, model.TakeRecords());
    return answer;
}

bool Changes(const Operation& operation)
{
    return operation.call == Call::Set || operation.call == Call::Update;
}

void Count(const Operation& operation, const Answer& answer, Tally& tally)
{
    ++tally.calls;
    ++tally.statuses[answer.status];
    tally.records += answer.records.size();
    const std::string& before =
        operation.call == Call::GetInPlace ? operation.key : operation.value;
    const bool starts = operation.call == Call::Get || operation.call == Call::Collect;
    tally.values += !Changes(operation) && answer.text != (starts ? std::string() : before);
    tally.updates += operation.call == Call::Set ? answer.status == 0 : 0;
}

std::string Serialized(xmlDocPtr document)
{
    xmlChar* text = nullptr;
    int size = 0;
    xmlDocDumpMemoryEnc(document, &text, &size, "UTF-8");
    const std::string result(reinterpret_cast<const char*>(text), static_cast<std::size_t>(size));
    xmlFree(text);
    return result;
}

std::string Report(const Operation& operation, const std::string& what)
{
    Case only;
    only.operations = {operation};
    return what + "\nin " + ToText(only);
}

} // namespace

std::string Difference(const Case& subject, Tally& tally)
{
    const MemoryFile file(subject.document);
    Library library(file.Path());
    const Document document(xmlParseFile(file.Path().c_str()));
    Reshape(document.get());
    if ((document == nullptr) != (library.GetDocument() == nullptr))
    {
        return "one of them does not parse the document";
    }
    tally.documents += document != nullptr;

    Model model(document.get());
    for (const Operation& operation : subject.operations)
    {
        const Answer answer = library.Perform(operation);
        const Answer expected = Expected(model, document.get(), operation);
        Count(operation, answer, tally);
        if (!(answer == expected))
        {
            std::ostringstream out;
            out << "the library answers " << answer << "the model " << expected;
            return Report(operation, out.str());
        }
        if (document != nullptr && !SameNodes(document->children, library.GetDocument()->children))
        {
            return Report(operation, "the library's document is\n" +
                                         Serialized(library.GetDocument()) + "the model's\n" +
                                         Serialized(document.get()));
        }
    }
    return "";
}

} // namespace kxmodel
