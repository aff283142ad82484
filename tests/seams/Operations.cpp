#include "Operations.h"

#include "support/Engine.h"
#include "support/EngineTranscript.h"

#include <libxml/parser.h>

#include <cctype>
#include <map>
#include <ostream>

namespace kxtest
{

namespace
{

// Longer than what a condition keeps in place.
const std::string kLongName(70, 'n');

const std::map<std::string, std::string> kFiles = {
    {"cfg.xml", "<cfg><net id=\"1\" mode=\"on\"><ip>10.0.0.1</ip><!--note--></net>"
                "<name>box</name><empty/></cfg>"},
    {"bad.xml", "<cfg>"},
    {"out.xml", ""},
    {"saved.xml", "<cfg/>"},
    // Its attributes are no plain texts, and a DTD may supply attributes.
    {"dtd.xml", "<!DOCTYPE cfg [<!ENTITY e \"1\"><!ATTLIST net mode CDATA \"on\">]>"
                "<cfg><net id=\"&e;\"><ip>10.0.0.1</ip></net><name>&e;</name></cfg>"},
    {"ids.xml", "<!DOCTYPE cfg [<!ATTLIST a id ID #IMPLIED>]>"
                "<cfg><net><a id=\"i\">1</a></net><last/></cfg>"},
    {"spaces.xml", "<cfg xmlns:p=\"urn:p\"><p:net/></cfg>"},
};

xmlNodePtr RootOf(xmlDocPtr document)
{
    return document->last; // without a call that the transcript would record
}

void RemoveRoot(xmlDocPtr document)
{
    const xmlNodePtr root = RootOf(document);
    xmlUnlinkNode(root);
    xmlFreeNode(root);
}

// --- What operations start from

void Nothing(World&)
{
}

void Reader(World& world)
{
    world.LoadReader("cfg.xml");
}

void EmptyReader(World& world)
{
    world.reader = std::make_unique<CXMLReader>();
}

void ReaderWithoutRoot(World& world)
{
    world.LoadReader("cfg.xml");
    RemoveRoot(world.ReaderDocument());
}

void ReaderWithDtd(World& world)
{
    world.LoadReader("dtd.xml");
}

void Writer(World& world)
{
    world.LoadWriter("cfg.xml");
}

void EmptyWriter(World& world)
{
    world.writer = std::make_unique<CXMLWriter>();
}

/** A writer on the test's own document, with @ref World::document still known. */
void LentWriter(World& world)
{
    world.document = ParseText(kFiles.at("cfg.xml"));
    EmptyWriter(world);
    world.writer->SetDataPtr(world.document);
}

void LentWriterWithoutRoot(World& world)
{
    LentWriter(world);
    RemoveRoot(world.document);
}

void LentWriterWithDtd(World& world)
{
    world.document = ParseText(kFiles.at("dtd.xml"));
    EmptyWriter(world);
    world.writer->SetDataPtr(world.document);
}

void Parser(World& world)
{
    world.LoadParser("cfg.xml");
    world.node = world.parser->GetRootNode();
}

void EmptyParser(World& world)
{
    world.parser = std::make_unique<CXmlParser>();
}

void Net(World& world)
{
    world.Select("/cfg/net");
}
void Name(World& world)
{
    world.Select("/cfg/name");
}
void Empty(World& world)
{
    world.Select("/cfg/empty");
}
void TextNode(World& world)
{
    world.Select("/cfg/name/text()");
}
void DocumentNode(World& world)
{
    world.Select("/");
}
void IdHolder(World& world)
{
    world.Select("/cfg/net", "ids.xml");
}
void IdElement(World& world)
{
    world.Select("/cfg/net/a", "ids.xml");
}
void IdAttribute(World& world)
{
    world.Select("/cfg/net/a/@id", "ids.xml");
}
void IdDocument(World& world)
{
    world.Select("/", "ids.xml");
}

/** Selects the DTD of ids.xml, which XPath does not select. */
void Dtd(World& world)
{
    IdDocument(world);
    const xmlXPathObjectPtr found = world.parser->GetNodeSet("/", CXmlNode());
    world.node.SetXmlNodePtr(found->nodesetval->nodeTab[0]->children);
    xmlXPathFreeObject(found);
}

/** Selects the holder of an ID that the engine's table has under an earlier value. */
void ChangedIdHolder(World& world)
{
    IdElement(world);
    const xmlXPathObjectPtr found = world.parser->GetNodeSet("/cfg/net/a/@id", CXmlNode());
    xmlNodeSetContent(found->nodesetval->nodeTab[0], reinterpret_cast<const xmlChar*>("j"));
    xmlXPathFreeObject(found);
}

/** Selects the reference in the element name of dtd.xml, which XPath does not select. */
void Reference(World& world)
{
    world.LoadParser("dtd.xml");
    const xmlXPathObjectPtr found = world.parser->GetNodeSet("/cfg/name", CXmlNode());
    world.node.SetXmlNodePtr(found->nodesetval->nodeTab[0]->children);
    xmlXPathFreeObject(found);
}

// --- Calls with much to write down

void Find(World& world, const std::string& key)
{
    world.reader->GetValue(key);
}

void FindInto(World& world, const std::string& key)
{
    std::string value;
    world.reader->GetValue(key, value);
}

void FindBelow(World& world, const std::string& key)
{
    world.reader->XMLGetValue(RootOf(world.ReaderDocument()), key);
}

void FindBelowInto(World& world, xmlNodePtr node, const std::string& key)
{
    std::string value;
    unsigned found = 0;
    world.reader->XMLGetValue(node, key, value, found);
}

void Update(World& world, const std::string& key)
{
    world.writer->SetValue(key, "new");
}

void UpdateBelow(World& world, xmlNodePtr node, const std::string& key)
{
    std::string value = "new";
    unsigned updated = 0;
    world.writer->XMLSetValue(node, key, value, updated);
}

void ReadAttribute(World& world, const std::string& name)
{
    std::string value;
    world.node.GetAttributeValue(name, value);
}

void ReadChild(World& world, const std::string& name)
{
    std::string value;
    world.node.GetContentOfChildNode(name, value);
}

// --- The operations

const std::vector<Operation> kReader = {
    {"CXMLReader()", Nothing, [](World& w) { w.reader = std::make_unique<CXMLReader>(); }},
    {"CXMLReader(path)", Nothing,
     [](World& w) { w.reader = std::make_unique<CXMLReader>(w.File("cfg.xml")); }},
    {"CXMLReader(path), not parsed", Nothing,
     [](World& w) { w.reader = std::make_unique<CXMLReader>(w.File("bad.xml")); }},
    {"~CXMLReader", Reader, [](World& w) { w.reader.reset(); }},
    {"~CXMLReader, no document", EmptyReader, [](World& w) { w.reader.reset(); }},
    {"GetCXMLReaderObject", Nothing,
     [](World& w) { w.reader.reset(GetCXMLReaderObject(w.File("cfg.xml").c_str())); }},
    {"GetCXMLReaderObject, not parsed", Nothing,
     [](World& w) { w.reader.reset(GetCXMLReaderObject(w.File("bad.xml").c_str())); }},
    {"GetCXMLReaderObject, null path", Nothing,
     [](World& w) { w.reader.reset(GetCXMLReaderObject(nullptr)); }},
    {"CXMLReader::ParseFile", EmptyReader,
     [](World& w) { w.reader->ParseFile(w.File("cfg.xml")); }},
    {"CXMLReader::ParseFile, not parsed", EmptyReader,
     [](World& w) { w.reader->ParseFile(w.File("bad.xml")); }},
    {"CXMLReader::ParseFile, document held",
     [](World& w)
     {
         w.LoadReader("cfg.xml");
         w.document = w.ReaderDocument();
     },
     [](World& w) { w.reader->ParseFile(w.File("cfg.xml")); }},
    {"GetDataPtr", Reader, [](World& w) { w.reader->GetDataPtr(); }},

    {"GetValue(key)", Reader, [](World& w) { Find(w, "cfg.name"); }},
    {"GetValue(key), several levels", Reader, [](World& w) { Find(w, "cfg.net.ip"); }},
    {"GetValue(key), condition on a plain attribute", Reader,
     [](World& w) { Find(w, "cfg.net@id=1&mode=on.ip"); }},
    {"GetValue(key), condition on a missing attribute", Reader,
     [](World& w) { Find(w, "cfg.net@none=1.ip"); }},
    {"GetValue(key), condition on a missing attribute, DTD", ReaderWithDtd,
     [](World& w) { Find(w, "cfg.net@none=1.ip"); }},
    {"GetValue(key), condition on a default attribute", ReaderWithDtd,
     [](World& w) { Find(w, "cfg.net@mode=on.ip"); }},
    {"GetValue(key), condition on an attribute with a reference", ReaderWithDtd,
     [](World& w) { Find(w, "cfg.net@id=1.ip"); }},
    {"GetValue(key), condition with a long name, DTD", ReaderWithDtd,
     [](World& w) { Find(w, "cfg.net@" + kLongName + "=1.ip"); }},
    {"GetValue(key), condition that names no attribute", ReaderWithDtd,
     [](World& w) { Find(w, "cfg.net@=1.ip"); }},
    {"GetValue(key), nothing found", Reader, [](World& w) { Find(w, "cfg.none"); }},
    {"GetValue(key), no document", EmptyReader, [](World& w) { Find(w, "cfg.name"); }},
    {"GetValue(key), empty key", Reader, [](World& w) { Find(w, ""); }},
    {"GetValue(key), no root", ReaderWithoutRoot, [](World& w) { Find(w, "cfg.name"); }},
    {"GetValue(key), no dot", Reader, [](World& w) { Find(w, "cfg"); }},
    {"GetValue(key), foreign root", Reader, [](World& w) { Find(w, "other.name"); }},

    {"GetValue(key, value)", Reader, [](World& w) { FindInto(w, "cfg.name"); }},
    {"GetValue(key, value), several levels", Reader, [](World& w) { FindInto(w, "cfg.net.ip"); }},
    {"GetValue(key, value), condition on a plain attribute", Reader,
     [](World& w) { FindInto(w, "cfg.net@id=1&mode=on.ip"); }},
    {"GetValue(key, value), condition on an attribute with a reference", ReaderWithDtd,
     [](World& w) { FindInto(w, "cfg.net@id=1.ip"); }},
    {"GetValue(key, value), nothing found", Reader, [](World& w) { FindInto(w, "cfg.none"); }},
    {"GetValue(key, value), no document", EmptyReader, [](World& w) { FindInto(w, "cfg.name"); }},
    {"GetValue(key, value), empty key", Reader, [](World& w) { FindInto(w, ""); }},
    {"GetValue(key, value), no root", ReaderWithoutRoot, [](World& w) { FindInto(w, "cfg.name"); }},
    {"GetValue(key, value), no dot", Reader, [](World& w) { FindInto(w, "cfg"); }},
    {"GetValue(key, value), foreign root", Reader, [](World& w) { FindInto(w, "other.name"); }},
    {"GetValue(key, value), key ends in a dot", Reader, [](World& w) { FindInto(w, "cfg."); }},

    {"XMLGetValue(node, key)", Reader, [](World& w) { FindBelow(w, "name"); }},
    {"XMLGetValue(node, key), condition on an attribute with a reference", ReaderWithDtd,
     [](World& w) { FindBelow(w, "net@id=1.ip"); }},
    {"XMLGetValue(node, key), empty key", Reader, [](World& w) { FindBelow(w, ""); }},
    {"XMLGetValue(node, key), null node", Reader,
     [](World& w) { w.reader->XMLGetValue(nullptr, "name"); }},
    {"XMLGetValue(node, key, value, found)", Reader,
     [](World& w) { FindBelowInto(w, RootOf(w.ReaderDocument()), "net.ip"); }},
    {"XMLGetValue(node, key, value, found), condition on an attribute with a reference",
     ReaderWithDtd, [](World& w) { FindBelowInto(w, RootOf(w.ReaderDocument()), "net@id=1.ip"); }},
    {"XMLGetValue(node, key, value, found), empty key", Reader,
     [](World& w) { FindBelowInto(w, RootOf(w.ReaderDocument()), ""); }},
    {"XMLGetValue(node, key, value, found), null node", Reader,
     [](World& w) { FindBelowInto(w, nullptr, "name"); }},
};

const std::vector<Operation> kWriter = {
    {"CXMLWriter()", Nothing, [](World& w) { w.writer = std::make_unique<CXMLWriter>(); }},
    {"CXMLWriter(path)", Nothing,
     [](World& w) { w.writer = std::make_unique<CXMLWriter>(w.File("cfg.xml")); }},
    {"CXMLWriter(path), not parsed", Nothing,
     [](World& w) { w.writer = std::make_unique<CXMLWriter>(w.File("bad.xml")); }},
    {"~CXMLWriter", Writer, [](World& w) { w.writer.reset(); }},
    {"~CXMLWriter, no document", EmptyWriter, [](World& w) { w.writer.reset(); }},
    {"GetCXMLWriterObject", Nothing,
     [](World& w) { w.writer.reset(GetCXMLWriterObject(w.File("cfg.xml").c_str())); }},
    {"GetCXMLWriterObject, not parsed", Nothing,
     [](World& w) { w.writer.reset(GetCXMLWriterObject(w.File("bad.xml").c_str())); }},
    {"GetCXMLWriterObject, null path", Nothing,
     [](World& w) { w.writer.reset(GetCXMLWriterObject(nullptr)); }},
    {"GetCXMLWriterObjectNoParam", Nothing,
     [](World& w) { w.writer.reset(GetCXMLWriterObjectNoParam()); }},
    {"CXMLWriter::ParseFile", EmptyWriter,
     [](World& w) { w.writer->ParseFile(w.File("cfg.xml")); }},
    {"CXMLWriter::ParseFile, document held", Writer,
     [](World& w) { w.writer->ParseFile(w.File("cfg.xml")); }},
    {"CXMLWriter::ParseFile, not parsed", Writer,
     [](World& w) { w.writer->ParseFile(w.File("bad.xml")); }},
    {"CXMLWriter::ParseFile, empty path", Writer, [](World& w) { w.writer->ParseFile(""); }},
    {"SetPath", Writer, [](World& w) { w.writer->SetPath(w.File("out.xml")); }},
    {"SetPath, empty path", Writer, [](World& w) { w.writer->SetPath(""); }},
    {"SetDataPtr", LentWriter, [](World& w) { w.writer->SetDataPtr(w.document); }},
    {"SetDataPtr, null", LentWriter, [](World& w) { w.writer->SetDataPtr(nullptr); }},
    {"SaveData",
     [](World& w)
     {
         Writer(w);
         w.writer->SetPath(w.File("out.xml"));
     },
     [](World& w) { w.writer->SaveData(); }},
    {"SaveData, not written",
     [](World& w)
     {
         Writer(w);
         w.writer->SetPath(w.files.Folder() + "none/out.xml");
     },
     [](World& w) { w.writer->SaveData(); }},
    {"SaveData, no path", LentWriter, [](World& w) { w.writer->SaveData(); }},
    {"SaveData, no document",
     [](World& w)
     {
         EmptyWriter(w);
         w.writer->SetPath(w.File("out.xml"));
     },
     [](World& w) { w.writer->SaveData(); }},

    {"SetValue", Writer, [](World& w) { Update(w, "cfg.name"); }},
    {"SetValue, several levels", Writer, [](World& w) { Update(w, "cfg.net.ip"); }},
    {"SetValue, condition on a plain attribute", Writer,
     [](World& w) { Update(w, "cfg.net@id=1&mode=on.ip"); }},
    {"SetValue, condition on a missing attribute", Writer,
     [](World& w) { Update(w, "cfg.net@none=1.ip"); }},
    {"SetValue, condition on a missing attribute, DTD", LentWriterWithDtd,
     [](World& w) { Update(w, "cfg.net@none=1.ip"); }},
    {"SetValue, condition on a default attribute", LentWriterWithDtd,
     [](World& w) { Update(w, "cfg.net@mode=on.ip"); }},
    {"SetValue, condition on an attribute with a reference", LentWriterWithDtd,
     [](World& w) { Update(w, "cfg.net@id=1.ip"); }},
    {"SetValue, nothing updated", Writer, [](World& w) { Update(w, "cfg.none"); }},
    {"SetValue, no document", EmptyWriter, [](World& w) { Update(w, "cfg.name"); }},
    {"SetValue, empty key", Writer, [](World& w) { Update(w, ""); }},
    {"SetValue, no root", LentWriterWithoutRoot, [](World& w) { Update(w, "cfg.name"); }},
    {"SetValue, no dot", Writer, [](World& w) { Update(w, "cfg"); }},
    {"SetValue, foreign root", Writer, [](World& w) { Update(w, "other.name"); }},
    {"SetValue, key ends in a dot", Writer, [](World& w) { Update(w, "cfg.name."); }},
    {"XMLSetValue", LentWriter, [](World& w) { UpdateBelow(w, RootOf(w.document), "name"); }},
    {"XMLSetValue, empty key", LentWriter,
     [](World& w) { UpdateBelow(w, RootOf(w.document), ""); }},
    {"XMLSetValue, null node", LentWriter, [](World& w) { UpdateBelow(w, nullptr, "name"); }},
};

const std::vector<Operation> kHandle = {
    {"CXmlAttr()", Nothing, [](World&) { CXmlAttr(); }},
    {"CXmlAttr(name, value)", Nothing, [](World&) { CXmlAttr("id", "1"); }},
    {"CXmlNode()", Nothing, [](World&) { CXmlNode(); }},
    {"CXmlNode(node)", LentWriter, [](World& w) { CXmlNode(RootOf(w.document)); }},
    {"SetXmlNodePtr", LentWriter, [](World& w) { w.node.SetXmlNodePtr(RootOf(w.document)); }},
    {"SetXmlNodePtr, null", Net, [](World& w) { w.node.SetXmlNodePtr(nullptr); }},
    {"IsNull", Net, [](World& w) { w.node.IsNull(); }},
    {"IsNull, null handle", Nothing, [](World& w) { w.node.IsNull(); }},
    {"Type", Net, [](World& w) { w.node.Type(); }},
    {"Type, null handle", Nothing, [](World& w) { w.node.Type(); }},
    {"Name", Net, [](World& w) { w.node.Name(); }},
    {"Name, null handle", Nothing, [](World& w) { w.node.Name(); }},
    {"Parent", Net, [](World& w) { w.node.Parent(); }},
    {"Parent, root", Parser, [](World& w) { w.node.Parent(); }},
    {"Parent, null handle", Nothing, [](World& w) { w.node.Parent(); }},
    {"FirstChild", Net, [](World& w) { w.node.FirstChild(); }},
    {"FirstChild, none", Name, [](World& w) { w.node.FirstChild(); }},
    {"FirstChild, null handle", Nothing, [](World& w) { w.node.FirstChild(); }},
    {"LastChild", Net, [](World& w) { w.node.LastChild(); }},
    {"LastChild, none", Name, [](World& w) { w.node.LastChild(); }},
    {"LastChild, null handle", Nothing, [](World& w) { w.node.LastChild(); }},
    {"NextSibling", Net, [](World& w) { w.node.NextSibling(); }},
    {"NextSibling, none", Empty, [](World& w) { w.node.NextSibling(); }},
    {"NextSibling, null handle", Nothing, [](World& w) { w.node.NextSibling(); }},
    {"PrevSibling", Name, [](World& w) { w.node.PrevSibling(); }},
    {"PrevSibling, none", Net, [](World& w) { w.node.PrevSibling(); }},
    {"PrevSibling, null handle", Nothing, [](World& w) { w.node.PrevSibling(); }},
    {"ClearNode", Net, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, empty element", Empty, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, null handle", Nothing, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, ID below", IdHolder, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, element with an ID", IdElement, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, reference to a declared entity", Reference, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, ID attribute", IdAttribute, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, document with an ID", IdDocument, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, DTD with a declaration", Dtd, [](World& w) { w.node.ClearNode(); }},
    {"ClearNode, document", DocumentNode, [](World& w) { w.node.ClearNode(); }},
    {"GetContent", Name, [](World& w) { w.node.GetContent(); }},
    {"GetContent, not only text", Net, [](World& w) { w.node.GetContent(); }},
    {"GetContent, null handle", Nothing, [](World& w) { w.node.GetContent(); }},
    {"SetContent", Name, [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, empty text", Name, [](World& w) { w.node.SetContent(""); }},
    {"SetContent, text node", TextNode, [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, null handle", Nothing, [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, ID below", IdHolder, [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, reference to a declared entity", Reference,
     [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, ID attribute", IdAttribute, [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, DTD", Dtd, [](World& w) { w.node.SetContent("new"); }},
    {"SetContent, document", DocumentNode, [](World& w) { w.node.SetContent("new"); }},
    {"GetContentOfChildNode", Parser, [](World& w) { ReadChild(w, "name"); }},
    {"GetContentOfChildNode, no text", Parser, [](World& w) { ReadChild(w, "empty"); }},
    {"GetContentOfChildNode, none", Parser, [](World& w) { ReadChild(w, "none"); }},
    {"GetContentOfChildNode, null handle", Nothing, [](World& w) { ReadChild(w, "name"); }},
    {"Children", Parser, [](World& w) { w.node.Children(); }},
    {"Children, null handle", Nothing, [](World& w) { w.node.Children(); }},
    {"FindChildNode", Parser, [](World& w) { w.node.FindChildNode("name"); }},
    {"FindChildNode, none", Parser, [](World& w) { w.node.FindChildNode("none"); }},
    {"FindChildNode, null handle", Nothing, [](World& w) { w.node.FindChildNode("name"); }},
    {"FindAllChildNodes", Parser, [](World& w) { w.node.FindAllChildNodes("name"); }},
    {"FindAllChildNodes, none", Parser, [](World& w) { w.node.FindAllChildNodes("none"); }},
    {"FindAllChildNodes, null handle", Nothing, [](World& w) { w.node.FindAllChildNodes("name"); }},
    {"AddChildNode", Net, [](World& w) { w.node.AddChildNode("b", "2"); }},
    {"AddChildNode, no content", Net, [](World& w) { w.node.AddChildNode("b", ""); }},
    {"AddChildNode, namespace", [](World& w) { w.Select("/cfg/*", "spaces.xml"); },
     [](World& w) { w.node.AddChildNode("b", "2"); }},
    {"AddChildNode, empty name", Net, [](World& w) { w.node.AddChildNode("", "2"); }},
    {"AddChildNode, null handle", Nothing, [](World& w) { w.node.AddChildNode("b", "2"); }},
    {"AddChildNode, not created", Net,
     [](World& w)
     {
         RefuseNext("xmlNewDocNode");
         w.node.AddChildNode("b", "2");
     }},
    {"AddSiblingNode", Net, [](World& w) { w.node.AddSiblingNode("b", "2"); }},
    {"AddSiblingNode, no content", Net, [](World& w) { w.node.AddSiblingNode("b", ""); }},
    {"AddSiblingNode, empty name", Net, [](World& w) { w.node.AddSiblingNode("", "2"); }},
    {"AddSiblingNode, root", Parser, [](World& w) { w.node.AddSiblingNode("b", "2"); }},
    {"AddSiblingNode, null handle", Nothing, [](World& w) { w.node.AddSiblingNode("b", "2"); }},
    {"AddSiblingNode, not created", Net,
     [](World& w)
     {
         RefuseNext("xmlNewNode");
         w.node.AddSiblingNode("b", "2");
     }},
    {"AddSiblingNode, not linked", Net,
     [](World& w)
     {
         RefuseNext("xmlAddSibling");
         w.node.AddSiblingNode("b", "2");
     }},
    {"RemoveChildNode", Parser, [](World& w) { w.node.RemoveChildNode("name"); }},
    {"RemoveChildNode, none", Parser, [](World& w) { w.node.RemoveChildNode("none"); }},
    {"RemoveChildNode, null handle", Nothing, [](World& w) { w.node.RemoveChildNode("name"); }},
    {"RemoveChildNode, ID below", IdHolder, [](World& w) { w.node.RemoveChildNode("a"); }},
    {"AddNewAttribute", Name, [](World& w) { w.node.AddNewAttribute("unit", "mm"); }},
    {"AddNewAttribute, not created", TextNode,
     [](World& w) { w.node.AddNewAttribute("unit", "mm"); }},
    {"AddNewAttribute, null handle", Nothing,
     [](World& w) { w.node.AddNewAttribute("unit", "mm"); }},
    {"GetAttributeValue", Net, [](World& w) { ReadAttribute(w, "id"); }},
    {"GetAttributeValue, none", Net, [](World& w) { ReadAttribute(w, "none"); }},
    {"GetAttributeValue, null handle", Nothing, [](World& w) { ReadAttribute(w, "id"); }},
    {"GetAttributeItems", Net, [](World& w) { w.node.GetAttributeItems(); }},
    {"GetAttributeItems, none", Name, [](World& w) { w.node.GetAttributeItems(); }},
    {"GetAttributeItems, null handle", Nothing, [](World& w) { w.node.GetAttributeItems(); }},
    {"RemoveAttribute", Net, [](World& w) { w.node.RemoveAttribute("id"); }},
    {"SetAttributeValue", Net, [](World& w) { w.node.SetAttributeValue("id", "2"); }},
};

const std::vector<Operation> kDocument = {
    {"CXmlParser()", Nothing, [](World& w) { w.parser = std::make_unique<CXmlParser>(); }},
    {"~CXmlParser", Parser, [](World& w) { w.parser.reset(); }},
    {"~CXmlParser, no document", EmptyParser, [](World& w) { w.parser.reset(); }},
    {"ClearDocument", Parser, [](World& w) { w.parser->ClearDocument(); }},
    {"ClearDocument, no document", EmptyParser, [](World& w) { w.parser->ClearDocument(); }},
    {"ParseXml", EmptyParser, [](World& w) { w.parser->ParseXml(w.File("cfg.xml")); }},
    {"ParseXml, document held", Parser, [](World& w) { w.parser->ParseXml(w.File("cfg.xml")); }},
    {"ParseXml, not readable", Parser,
     [](World& w) { w.parser->ParseXml(w.files.Folder() + "none.xml"); }},
    {"ParseXml, not parsed", EmptyParser, [](World& w) { w.parser->ParseXml(w.File("bad.xml")); }},
    {"SaveXml", Parser, [](World& w) { w.parser->SaveXml(w.File("out.xml")); }},
    {"SaveXml, recorded path", [](World& w) { w.LoadParser("saved.xml"); },
     [](World& w) { w.parser->SaveXml(""); }},
    {"SaveXml, no document", EmptyParser, [](World& w) { w.parser->SaveXml(w.File("out.xml")); }},
    {"SaveXml, not readable", Parser,
     [](World& w) { w.parser->SaveXml(w.files.Folder() + "none.xml"); }},
    {"SaveXml, not written", Parser,
     [](World& w)
     {
         AnswerNextFormatSave(-1);
         w.parser->SaveXml(w.File("out.xml"));
     }},
    {"CreateNewXmlDoc", EmptyParser, [](World& w) { w.parser->CreateNewXmlDoc("cfg"); }},
    {"CreateNewXmlDoc, document held", Parser, [](World& w) { w.parser->CreateNewXmlDoc("cfg"); }},
    {"CreateNewXmlDoc, empty name", Parser, [](World& w) { w.parser->CreateNewXmlDoc(""); }},
    {"CreateNewXmlDoc, no document created", EmptyParser,
     [](World& w)
     {
         RefuseNext("xmlNewDoc");
         w.parser->CreateNewXmlDoc("cfg");
     }},
    {"CreateNewXmlDoc, no root created", EmptyParser,
     [](World& w)
     {
         RefuseNext("xmlNewNode");
         w.parser->CreateNewXmlDoc("cfg");
     }},
    {"GetRootNode", Parser, [](World& w) { w.parser->GetRootNode(); }},
    {"GetRootNode, no document", EmptyParser, [](World& w) { w.parser->GetRootNode(); }},
    {"IsReadable", EmptyParser, [](World& w) { w.parser->IsReadable(w.File("cfg.xml")); }},
    {"IsReadable, no such file", EmptyParser,
     [](World& w) { w.parser->IsReadable(w.files.Folder() + "none.xml"); }},

    {"GetNodeSet", Parser, [](World& w) { w.result = w.parser->GetNodeSet("//name", w.node); }},
    {"GetNodeSet, null handle", Parser,
     [](World& w) { w.result = w.parser->GetNodeSet("//name", CXmlNode()); }},
    {"GetNodeSet, malformed expression", Parser,
     [](World& w) { w.result = w.parser->GetNodeSet("//[", w.node); }},
    {"GetNodeSet, no document", EmptyParser,
     [](World& w) { w.result = w.parser->GetNodeSet("//name", w.node); }},
    {"GetNodeSet, no context created", Parser,
     [](World& w)
     {
         RefuseNext("xmlXPathNewContext");
         w.result = w.parser->GetNodeSet("//name", w.node);
     }},
    {"FindNode", Parser, [](World& w) { w.parser->FindNode("//name", w.node); }},
    {"FindNode, none", Parser, [](World& w) { w.parser->FindNode("//none", w.node); }},
    {"FindNode, a number", Parser, [](World& w) { w.parser->FindNode("count(//name)", w.node); }},
    {"FindNode, malformed expression", Parser, [](World& w) { w.parser->FindNode("//[", w.node); }},
    {"FindNode, no document", EmptyParser, [](World& w) { w.parser->FindNode("//name", w.node); }},
    {"FindNode, no context created", Parser,
     [](World& w)
     {
         RefuseNext("xmlXPathNewContext");
         w.parser->FindNode("//name", w.node);
     }},
    {"FindAllNodes", Parser, [](World& w) { w.parser->FindAllNodes("/cfg/*", w.node); }},
    {"FindAllNodes, none", Parser, [](World& w) { w.parser->FindAllNodes("//none", w.node); }},
    {"FindAllNodes, a number", Parser,
     [](World& w) { w.parser->FindAllNodes("count(//name)", w.node); }},
    {"FindAllNodes, malformed expression", Parser,
     [](World& w) { w.parser->FindAllNodes("//[", w.node); }},
    {"FindAllNodes, no document", EmptyParser,
     [](World& w) { w.parser->FindAllNodes("//name", w.node); }},
    {"FindAllNodes, no context created", Parser,
     [](World& w)
     {
         RefuseNext("xmlXPathNewContext");
         w.parser->FindAllNodes("//name", w.node);
     }},
    {"AddNewNode", Net, [](World& w) { w.parser->AddNewNode(w.node, "b", "2"); }},
    {"AddNewNode, null handle", Parser,
     [](World& w) { w.parser->AddNewNode(CXmlNode(), "b", "2"); }},
    {"AddNewNode, not created", Net,
     [](World& w)
     {
         RefuseNext("xmlNewDocNode");
         w.parser->AddNewNode(w.node, "b", "2");
     }},
    {"RemoveNode", Name, [](World& w) { w.parser->RemoveNode(w.node); }},
    {"RemoveNode, null handle", Parser, [](World& w) { w.parser->RemoveNode(CXmlNode()); }},
    {"RemoveNode, ID below", IdHolder, [](World& w) { w.parser->RemoveNode(w.node); }},
    {"RemoveNode, ID with a changed value", ChangedIdHolder,
     [](World& w) { w.parser->RemoveNode(w.node); }},
    {"RemoveNode, ID attribute", IdAttribute, [](World& w) { w.parser->RemoveNode(w.node); }},
    {"RemoveNode, DTD without an entity", Dtd, [](World& w) { w.parser->RemoveNode(w.node); }},
    {"RemoveNode, document", DocumentNode, [](World& w) { w.parser->RemoveNode(w.node); }},
};

} // namespace

OperationFiles::OperationFiles()
{
    for (const auto& [name, content] : kFiles)
    {
        m_folder.Write(name, content);
    }
}

std::string OperationFiles::Path(const std::string& name) const
{
    return m_folder.Path(name);
}

std::string OperationFiles::Folder() const
{
    return m_folder.Path("");
}

World::~World()
{
    if (writer != nullptr)
    {
        if (document != nullptr)
        {
            writer->SetDataPtr(nullptr);
        }
        writer.reset();
    }
    xmlXPathFreeObject(result);
    xmlFree(TakeContent()); // GetContent leaves it allocated
    xmlFreeDoc(document);
    parser.reset();
    xmlKeepBlanksDefault(1);
    TakeEngineErrors();
}

void World::LoadReader(const std::string& name)
{
    reader = std::make_unique<CXMLReader>(File(name));
}

void World::LoadWriter(const std::string& name)
{
    writer = std::make_unique<CXMLWriter>(File(name));
}

void World::LoadParser(const std::string& name)
{
    parser = std::make_unique<CXmlParser>();
    parser->ParseXml(File(name));
}

CXmlNode World::Node(const std::string& xpath)
{
    return parser->FindNode(xpath, CXmlNode());
}

void World::Select(const std::string& xpath, const std::string& name)
{
    LoadParser(name);
    node = Node(xpath);
}

std::ostream& operator<<(std::ostream& out, const Operation& operation)
{
    return out << operation.name;
}

std::string TestName(const testing::TestParamInfo<Operation>& info)
{
    std::string name;
    for (const char letter : info.param.name)
    {
        const bool isWord = std::isalnum(static_cast<unsigned char>(letter)) != 0;
        name += letter == '~' ? "Destroy" : std::string(isWord ? 1 : 0, letter);
    }
    return name + '_' + std::to_string(info.index);
}

const std::vector<Operation>& AllOperations()
{
    static const std::vector<Operation> all = []
    {
        std::vector<Operation> list;
        for (const auto& group : {kReader, kWriter, kHandle, kDocument})
        {
            list.insert(list.end(), group.begin(), group.end());
        }
        return list;
    }();
    return all;
}

} // namespace kxtest
