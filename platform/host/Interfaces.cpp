#include "IConfigReader.h"
#include "IConfigWriter.h"

// Out of line, as on the target: the tables and type information of both interfaces live here, in
// the platform's library, and nowhere else.

IConfigReader::IConfigReader()
{
}
IConfigReader::~IConfigReader()
{
}

IConfigWriter::IConfigWriter()
{
}
IConfigWriter::~IConfigWriter()
{
}
