#ifndef KX_ICONFIGWRITER_H
#define KX_ICONFIGWRITER_H

#include <string>

#pragma GCC visibility push(default)

/**
 * The platform's interface to a configuration that is changed by key and saved.
 *
 * The order of the virtual operations is the order of their slots in the table and is part of the
 * platform's binary interface: never reorder, insert or remove one. The destructor takes the first
 * two slots (complete object, deleting).
 *
 * What an operation does and returns is told by the class that implements it (CXMLWriter).
 */
class IConfigWriter
{
public:
    IConfigWriter();
    virtual ~IConfigWriter();

    /**
     * Loads a configuration file.
     * @param path  the file's path.
     * @return a status code, 0 for success.
     */
    virtual int ParseFile(const std::string& path) = 0;

    /**
     * Replaces text.
     * @param key    the key.
     * @param value  the new text.
     * @return a status code, 0 for success.
     */
    virtual int SetValue(const std::string& key, std::string value) = 0;

    /** Writes the configuration to its path. @return a status code, 0 for success. */
    virtual int SaveData() = 0;

    /**
     * Names the file that SaveData() writes.
     * @param path  the file's path.
     * @return a status code, 0 for success.
     */
    virtual int SetPath(const std::string& path) = 0;

    /**
     * Adopts a document in place of the one held.
     * @param document  untyped; may be null.
     */
    virtual void SetDataPtr(void* document) = 0;
};

#pragma GCC visibility pop

#endif
