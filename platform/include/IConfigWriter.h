#ifndef KX_ICONFIGWRITER_H
#define KX_ICONFIGWRITER_H

#include <string>

#pragma GCC visibility push(default)

/// The platform's interface for changing a configuration by key and saving it. CXMLWriter
/// implements it and documents what each operation does and returns.
///
/// The order of the virtual operations is the platform's binary interface: never reorder, insert
/// or remove one. The destructor takes the first two slots (complete object, deleting).
class IConfigWriter
{
public:
    IConfigWriter();
    virtual ~IConfigWriter();

    /// Loads a configuration file. Returns a status code, 0 for success.
    virtual int ParseFile(const std::string& path) = 0;

    /// Replaces the text under key by value. Returns a status code, 0 for success.
    virtual int SetValue(const std::string& key, std::string value) = 0;

    /// Writes the configuration to its path. Returns a status code, 0 for success.
    virtual int SaveData() = 0;

    /// Sets the path that SaveData() writes to. Returns a status code, 0 for success.
    virtual int SetPath(const std::string& path) = 0;

    /// Adopts document, untyped, or none if it is null, in place of the one that is held.
    virtual void SetDataPtr(void* document) = 0;
};

#pragma GCC visibility pop

#endif
