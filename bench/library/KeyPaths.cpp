// This library's key-path store.

#include "Documents.h"
#include "Operations.h"
#include "library/Loaded.h"

#include "CXMLReader.h"

namespace bench
{

namespace
{

std::string KeyOf(const std::string& root, const std::vector<std::string>& names)
{
    std::string key = root;
    for (const std::string& name : names)
    {
        key += '.' + name;
    }
    return key;
}

std::string KeyOf(const FirstRead& read)
{
    std::vector<std::string> names = read.names;
    if (!read.attribute.empty())
    {
        names[0] += '@' + read.attribute + '=' + read.attributeValue;
    }
    return KeyOf(read.root, names);
}

/** Terms that hold, each of which has to be tested. */
std::string AndTerms(std::size_t count)
{
    std::string terms;
    for (std::size_t term = 0; term != count; ++term)
    {
        terms += (term == 0 ? "" : "&") + TermName(term) + '=' + TermValue(term);
    }
    return terms;
}

/** Terms of which only the last holds. */
std::string OrTerms(std::size_t count)
{
    std::string terms;
    for (std::size_t term = 0; term + 1 < count; ++term)
    {
        terms += TermName(term) + "=other|";
    }
    return terms + TermName(count - 1) + '=' + TermValue(count - 1);
}

void AddLookUp(const std::string& workload, const std::string& file, const std::string& key,
               const std::string& expected)
{
    Add(workload, kLibrary, expected,
        [file, key]
        {
            return [reader = LoadedReader(file), key]
            {
                std::string value;
                reader->GetValue(key, value);
                return value;
            };
        });
    Add(workload, kLibraryReturning, expected,
        [file, key]
        { return [reader = LoadedReader(file), key] { return reader->GetValue(key); }; });
}

void AddLookUpsOfManyValues()
{
    for (const std::size_t count : Joined(kTextCounts, kMoreTextCounts))
    {
        // The value that the one-argument form returns runs together: another result.
        Add(Sized(kLookUpTexts, count), kLibrary, AllTexts(count),
            [count]
            {
                return [reader = LoadedReader(Texts(count)), key = std::string("cfg.item")]
                {
                    std::string value;
                    reader->GetValue(key, value);
                    return value;
                };
            });
    }
}

void AddLoads()
{
    for (const FirstRead& read : FirstReads())
    {
        Add(read.workload, kLibrary, read.value,
            [read]
            {
                return [path = read.path, key = KeyOf(read)]
                {
                    CXMLReader reader(path);
                    std::string value;
                    reader.GetValue(key, value);
                    return value;
                };
            });
    }
}

void AddLookUps()
{
    for (const std::size_t count : Joined(kSiblingCounts, kMoreSiblingCounts))
    {
        AddLookUp(Sized(kLookUpPlain, count), Siblings(count), "cfg.service", kServiceValue);
    }
    for (const std::size_t count : Joined(kItemCounts, kMoreItemCounts))
    {
        AddLookUp(Sized(kLookUpCondition, count), Items(count),
                  "cfg.item@id=" + std::to_string(count) + ".name", ItemName(count));
    }
    for (const std::size_t levels : Joined(kDepths, kMoreDepths))
    {
        AddLookUp(Sized(kLookUpDepth, levels), Nested(levels), KeyOf("cfg", NestedNames(levels)),
                  kNestedValue);
    }
    for (const std::size_t count : kTermCounts)
    {
        AddLookUp(Sized(kLookUpAndTerms, count), Attributed(),
                  "cfg.item@" + AndTerms(count) + ".name", kAttributedValue);
        AddLookUp(Sized(kLookUpOrTerms, count), Attributed(),
                  "cfg.item@" + OrTerms(count) + ".name", kAttributedValue);
    }
}

void AddUpdates()
{
    const std::string key = "cfg.label";
    const std::string text = "after";
    Add(kUpdate, kLibrary, 0,
        [key, text]
        {
            return [writer = LoadedWriter(Channels(kUpdatedChannels)), key, text]
            { return writer->SetValue(key, text); };
        });
    // The text stays what it is, as lookups work on the same document.
    Add(Sized(kUpdateCondition, kUpdatedItems), kLibrary, 0,
        []
        {
            return [writer = LoadedWriter(Items(kUpdatedItems)),
                    key = "cfg.item@id=" + std::to_string(kUpdatedItems) + ".name",
                    text = ItemName(kUpdatedItems)] { return writer->SetValue(key, text); };
        });
    Add(kUpdateAndSave, kLibrary, 0,
        [key, text]
        {
            const std::string path = ScratchFile("saved.xml");
            return Seen(
                [writer = LoadedWriter(Channels(kUpdatedChannels)), key, text]
                {
                    const int updated = writer->SetValue(key, text);
                    const int saved = writer->SaveData();
                    return updated + saved;
                },
                [path] { return IsUpdated(path); });
        });
}

const Registration registration(
    []
    {
        AddLoads();
        AddLookUps();
        AddLookUpsOfManyValues();
        AddUpdates();
    });

} // namespace

} // namespace bench
