#include "commands/Set.h"

#include "commands/CreateElements.h"
#include "commands/KeyArgument.h"
#include "commands/SetNodes.h"
#include "commands/ValueArgument.h"
#include "file/Engine.h"
#include "file/GuestWriter.h"
#include "file/Load.h"
#include "file/Nodes.h"
#include "file/StoredText.h"
#include "output/Failure.h"
#include "output/Quoting.h"
#include "output/Report.h"
#include "walk/LookupReach.h"
#include "walk/UpdateReach.h"

#include "diag/Status.h"

#include <algorithm>

namespace
{

std::vector<Assignment> AssignmentsOf(const SetArguments& arguments)
{
    std::vector<std::string> words = {arguments.key};
    words.insert(words.end(), arguments.values.begin(), arguments.values.end());
    if (!arguments.valueFile.empty())
    {
        words.push_back(ReadValue(arguments.valueFile, *arguments.input));
    }
    std::vector<Assignment> assignments;
    for (size_t i = 0; i != words.size(); i += 2)
    {
        assignments.push_back({words[i], words[i + 1]});
    }
    return assignments;
}

/** Requires a value for each key. */
void RequireValues(const SetArguments& arguments)
{
    const bool hasFile = !arguments.valueFile.empty();
    if (hasFile && !arguments.values.empty())
    {
        throw Failure(ExitStatus::BadUsage,
                      "--value-from takes the place of VALUE: give one KEY only");
    }
    if (!hasFile && arguments.values.size() % 2 == 0)
    {
        const std::string& key = arguments.values.empty() ? arguments.key : arguments.values.back();
        throw Failure(ExitStatus::BadUsage, "VALUE is required after the key " + Quoted(key) +
                                                "; a value with spaces needs quotes");
    }
}

void Update(CXMLWriter& writer, const Assignment& assignment, const std::string& file)
{
    const FirstEngineError error;
    const int status = writer.SetValue(assignment.key, assignment.value);
    error.RequireMemory();
    if (status == kx::StatusNotFound)
    {
        throw Failure(ExitStatus::NothingFound, "nothing found: no element of " + file +
                                                    " has text that can be replaced under " +
                                                    Quoted(assignment.key));
    }
    if (status != kx::StatusOk)
    {
        throw Failure(ExitStatus::BadUsage,
                      "malformed key " + Quoted(assignment.key) + ": it ends in \".\"");
    }
}

/** An element and the text that it had. */
struct ElementText
{
    const xmlNode* element;
    std::string text;
};

std::vector<ElementText> TextsOf(const std::vector<const xmlNode*>& elements)
{
    std::vector<ElementText> texts;
    texts.reserve(elements.size());
    for (const xmlNode* const element : elements)
    {
        texts.push_back({element, ContentOf(element)});
    }
    return texts;
}

void RequireStored(const std::vector<ElementText>& texts, const std::string& value)
{
    for (const ElementText& text : texts)
    {
        RequireStored(text.element, value);
    }
}

/** @return those of @p texts that are not those of their elements any more. */
std::vector<ElementText> Changed(const std::vector<ElementText>& texts)
{
    std::vector<ElementText> changed;
    std::copy_if(texts.begin(), texts.end(), std::back_inserter(changed),
                 [](const ElementText& text) { return ContentOf(text.element) != text.text; });
    return changed;
}

/** @return a warning if an update changed @p changed, and a lookup of the key finds only @p found.
 */
std::string ReachWarning(const std::string& key, const std::vector<ElementText>& changed,
                         std::vector<const xmlNode*> found)
{
    std::sort(found.begin(), found.end());
    const auto isFound = [&found](const ElementText& text)
    { return std::binary_search(found.begin(), found.end(), text.element); };
    const auto count = static_cast<size_t>(std::count_if(changed.begin(), changed.end(), isFound));
    return count == changed.size()
               ? ""
               : "warning: " + Quoted(key) + " changes " + std::to_string(changed.size()) +
                     (changed.size() == 1 ? " element; get finds " : " elements; get finds ") +
                     std::to_string(count) + " of them";
}

/** The updates of one document in memory. */
class Updates
{
public:
    Updates(CXMLReader& reader, const SetArguments& arguments, Edit& edit)
        : m_reader(reader), m_writer(reader), m_arguments(arguments), m_edit(edit)
    {
    }

    void Apply(const Assignment& assignment)
    {
        xmlDoc* const document = DocumentOf(m_reader);
        RequireKey(assignment.key, m_arguments.file, m_reader);
        RequireXmlText(assignment.value);
        RequireDeclaredEntities(assignment.value, document);
        m_changes.BeginUpdate();
        const std::vector<const xmlNode*> found = ElementsOfLookup(document, assignment.key);
        if (m_arguments.create && found.empty())
        {
            CreateElements(document, assignment.key, assignment.value, m_changes);
            m_edit.RequireLoadable(document, assignment.value);
        }
        else
        {
            ReplaceTexts(assignment, found);
        }
    }

    ExitStatus Finish()
    {
        xmlDoc* const document = DocumentOf(m_reader);
        const ExitStatus status = m_edit.Finish(document, m_changes.List(document));
        const size_t textless = m_changes.CountTextless();
        if (textless != 0)
        {
            m_edit.Warn("warning: no later set reaches " + std::to_string(textless) +
                        (textless == 1 ? " element, which has" : " elements, which have") +
                        " no plain text any more");
        }
        return status;
    }

private:
    /** @param found  the elements that a lookup finds. */
    void ReplaceTexts(const Assignment& assignment, const std::vector<const xmlNode*>& found)
    {
        xmlDoc* const document = DocumentOf(m_reader);
        const auto texts = TextsOf(ElementsOfUpdate(document, assignment.key));
        Update(m_writer.Get(), assignment, m_arguments.file);
        RequireStored(texts, assignment.value);
        m_edit.RequireLoadable(document, assignment.value);
        const std::vector<ElementText> changed = Changed(texts);
        m_edit.Warn(ReachWarning(assignment.key, changed, found));
        for (const ElementText& text : changed)
        {
            m_changes.NoteChanged(text.element, text.text);
        }
    }

    CXMLReader& m_reader;
    GuestWriter m_writer;
    const SetArguments& m_arguments;
    Edit& m_edit;
    ElementChanges m_changes;
};

} // namespace

ExitStatus Set(const SetArguments& arguments, Report& report)
{
    RequireValues(arguments);
    const std::vector<Assignment> assignments =
        AssignmentsOf(arguments); // before the lock: input can be slow
    Edit edit(arguments.file, arguments.saving, report);
    if (arguments.byNode)
    {
        return SetNodes(assignments, arguments.file, arguments.all, edit);
    }
    const LoadedReader reader = LoadFile(arguments.file);
    Updates updates(*reader, arguments, edit);
    for (const Assignment& assignment : assignments)
    {
        updates.Apply(assignment);
    }
    return updates.Finish();
}
