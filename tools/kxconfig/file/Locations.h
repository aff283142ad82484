#ifndef KX_TOOLS_LOCATIONS_H
#define KX_TOOLS_LOCATIONS_H

#include <libxml/tree.h>

#include <string>
#include <vector>

/** How a location spells a name with a prefix. */
enum class Spelling
{
    Path,      ///< p:a, as in the document
    Expression ///< *[name()='p:a'], since the library evaluates without registered prefixes
};

/**
 * The location paths of many nodes of a document, which must not change meanwhile.
 *
 * They are what xmlGetNodePath() gives, which counts the siblings of a node anew for each path; but
 * no two nodes have the same one, where a prefix is declared for only some of its bearers. Here the
 * children of a node are counted once. Their positions are kept in the field that the engine's
 * records have for applications (_private), and count until the object is destroyed.
 */
class Locations
{
public:
    Locations() : Locations(Spelling::Path) {}
    explicit Locations(Spelling spelling) : m_spelling(spelling) {}
    ~Locations();
    Locations(Locations&&) = default;
    Locations& operator=(Locations&&) = delete;

    /**
     * @return the location path of @p node, such as /cfg/net[2]/ip; for a node in a DTD, which has
     * none, words in parentheses.
     */
    std::string Of(const xmlNode* node);

    /** Appends the same to @p text. */
    void AppendTo(std::string& text, const xmlNode* node);

    /** @return the last step of the path of @p node, which has one, such as net[2]. */
    std::string LastStepOf(const xmlNode* node);

private:
    /** A node on the last path, and where its step ends there. */
    struct Step
    {
        const xmlNode* node;
        size_t end;
    };

    bool IsOnPath(const xmlNode* node, size_t depth) const;
    void Follow(const xmlNode* node, size_t depth);
    void AppendLastStep(std::string& text, const xmlNode* node);
    size_t PositionOf(const xmlNode* node);

    const Spelling m_spelling;
    std::string m_path; ///< the last one: most paths begin like the one before
    std::vector<Step> m_steps;
    std::vector<const xmlNode*> m_below;   ///< of a path, the nodes that the last one does not have
    std::vector<const xmlNode*> m_counted; ///< the nodes whose children are counted
};

/** @return whether a location path selects @p node: none selects what is inside a DTD. */
bool HasLocation(const xmlNode* node);

#endif
