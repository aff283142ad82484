#ifndef KX_TOOLS_TEXTS_H
#define KX_TOOLS_TEXTS_H

#include <string>
#include <vector>

struct _xmlNode;

/** An element whose text an update has changed. */
struct ChangedText
{
    std::string location; ///< location path, such as /cfg/net[2]/ip
    std::string before;
    std::string after;
};

/** The texts of a document's elements as they are now, to be compared with later ones. */
class Texts
{
public:
    /** @param document  an xmlDocPtr, which must outlive the object. */
    explicit Texts(void* document);

    /** @return the elements whose text has changed since, in document order. */
    std::vector<ChangedText> Changes() const;

private:
    struct Text
    {
        _xmlNode* element;
        std::string content;
    };

    std::vector<Text> m_texts;
};

#endif
