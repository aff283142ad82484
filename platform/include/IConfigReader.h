#ifndef KX_ICONFIGREADER_H
#define KX_ICONFIGREADER_H

#include <string>

#pragma GCC visibility push(default)

/// The platform's interface for reading a configuration by key. CXMLReader implements it and
/// documents what each operation does and returns.
///
/// The order of the virtual operations is the platform's binary interface: never reorder, insert
/// or remove one. The destructor takes the first two slots (complete object, deleting).
class IConfigReader
{
public:
    IConfigReader();
    virtual ~IConfigReader();

    /// Loads a configuration file. Returns a status code, 0 for success.
    virtual int ParseFile(const std::string& path) = 0;

    /// Returns the value or values under key, or "".
    virtual std::string GetValue(const std::string& key) = 0;

    /// Appends the value or values under key to value. Returns a status code, 0 for success.
    virtual int GetValue(const std::string& key, std::string& value) = 0;

    /// Returns the loaded document, untyped, or null. The reader keeps ownership.
    virtual void* GetDataPtr() = 0;
};

#pragma GCC visibility pop

#endif
