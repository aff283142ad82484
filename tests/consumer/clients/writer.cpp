// A client that changes values: the configuration file itself is left alone.

#include "CXMLReader.h"
#include "CXMLWriter.h"

#include <stdio.h>

int main(int argc, char** argv)
{
    if (argc < 2)
    {
        return 2;
    }
    CXMLReader reader(argv[1]);
    IConfigWriter* const writer = GetCXMLWriterObjectNoParam();
    bool good = writer != 0;
    if (good)
    {
        writer->SetDataPtr(reader.GetDataPtr());
        good = writer->SetValue("gateway.name", "changed") == 0 && writer->SaveData() == -2 &&
               reader.GetValue("gateway.name") == "changed";
        writer->SetDataPtr(0);
    }
    delete writer;
    CXMLWriter* const made = GetCXMLWriterObject(argv[1]);
    good = good && made != 0 && made->SetValue("gateway.missing", "x") == -2;
    delete made;
    puts(good ? "good" : "wrong values");
    return good ? 0 : 1;
}
