// Changes the document of a reader through a writer: share_document FILE
//
// Both destructors free the document, so the writer is detached before either object is destroyed.

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include <iostream>

int main(int argc, char** argv)
{
    IConfigReader* const reader = GetCXMLReaderObject(argc == 2 ? argv[1] : 0);
    IConfigWriter* const writer = GetCXMLWriterObjectNoParam();
    if (reader != 0 && writer != 0 && reader->GetDataPtr() != 0)
    {
        std::cout << "before: " << reader->GetValue("gateway.name") << '\n';

        writer->SetDataPtr(reader->GetDataPtr());
        writer->SetPath(argv[1]);
        writer->SetValue("gateway.name", "line-4-gateway");
        std::cout << "the reader sees: " << reader->GetValue("gateway.name") << '\n';
        std::cout << (writer->SaveData() == 0 ? "saved" : "not saved") << '\n';

        writer->SetDataPtr(0); // detached: only the reader frees the document
    }
    delete writer;
    delete reader;
    return 0;
}
