#ifndef KX_ICONFIGREADER_H
#define KX_ICONFIGREADER_H

#include <string>

#pragma GCC visibility push(default)

/**
 * The platform's interface to a configuration that is read by key.
 *
 * The order of the virtual operations is the order of their slots in the table and is part of the
 * platform's binary interface: never reorder, insert or remove one. The destructor takes the first
 * two slots (complete object, deleting).
 *
 * What an operation does and returns is told by the class that implements it (CXMLReader).
 */
class IConfigReader
{
public:
    IConfigReader();
    virtual ~IConfigReader();

    /**
     * Loads a configuration file.
     * @param path  the file's path.
     * @return a status code, 0 for success.
     */
    virtual int ParseFile(const std::string& path) = 0;

    /**
     * Looks up a value.
     * @param key  the key.
     * @return the value or values, or an empty string.
     */
    virtual std::string GetValue(const std::string& key) = 0;

    /**
     * Looks up a value and appends it.
     * @param key    the key.
     * @param value  the value or values are appended to it.
     * @return a status code, 0 for success.
     */
    virtual int GetValue(const std::string& key, std::string& value) = 0;

    /** @return the loaded document, untyped, or null. The reader keeps the ownership. */
    virtual void* GetDataPtr() = 0;
};

#pragma GCC visibility pop

#endif
