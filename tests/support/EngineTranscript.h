#ifndef KX_TESTS_SUPPORT_ENGINETRANSCRIPT_H
#define KX_TESTS_SUPPORT_ENGINETRANSCRIPT_H

// The test program defines every engine function that the library calls, and passes each call on to
// the engine. A transcript records the calls as text; calls that the engine makes itself are left
// out.

#include <libxml/hash.h>
#include <libxml/tree.h>
#include <libxml/xpath.h>

#include <dlfcn.h>

#include <string>
#include <type_traits>
#include <vector>

namespace kxtest
{

/**
 * Records the library's engine calls from construction to destruction, one line each:
 * function(argument, ...) = result.
 *
 * Pointers appear by what they designate: null, doc, <element>, @attribute, text, or the name of
 * what the engine created in this transcript (new doc, new, context, result). Integer results are
 * left out.
 */
class EngineTranscript
{
public:
    /** @param folder  paths in it appear relative to it. */
    explicit EngineTranscript(std::string folder);
    ~EngineTranscript();
    EngineTranscript(const EngineTranscript&) = delete;
    EngineTranscript& operator=(const EngineTranscript&) = delete;

    std::vector<std::string> Take();
};

/** Makes the next call of the engine's @p function do nothing and return null. */
void RefuseNext(const std::string& function);

/** @return what xmlNodeGetContent returned last, for the caller to free; then null. */
xmlChar* TakeContent();

namespace detail
{

std::string Render(const char* text);
std::string Render(const xmlChar* text);
std::string Render(int number);
std::string Render(const xmlNode* node);
std::string Render(const xmlEntity* entity);
std::string Render(const xmlDoc* document);
std::string Render(const xmlAttr* attribute);
std::string Render(const xmlNs* space);
std::string Render(const xmlXPathContext* context);
std::string Render(const xmlXPathObject* result);
std::string Render(const void* memory);
std::string Render(const xmlHashTable* ids);
std::string Render(xmlHashScanner visit);
std::string Render(xmlHashDeallocator release);

/** One call of the engine, until its destruction; calls within it are the engine's own. */
class Call
{
public:
    explicit Call(const char* function);
    ~Call();
    Call(const Call&) = delete;
    Call& operator=(const Call&) = delete;

    /** @return whether RefuseNext() names the call. */
    bool Refused() const;

    /** @return whether to render the call. */
    bool Recorded() const;

    template <class... Arguments>
    void Write(Arguments... arguments)
    {
        std::string list;
        ((list += (list.empty() ? "" : ", ") + Render(arguments)), ...);
        Begin(list);
    }

    template <class Result>
    void WriteResult(Result result)
    {
        if constexpr (std::is_pointer_v<Result>)
        {
            NameResult(result);
            End(IsText() ? Render(static_cast<const void*>(result)) : Render(result));
        }
    }

private:
    void Begin(const std::string& arguments);
    void NameResult(const void* result);
    bool IsText() const;
    void End(const std::string& result);

    const std::string m_function;
};

} // namespace detail

/** Passes a call of @p Function, which the caller defines, on to the engine. */
template <auto Function, class... Arguments>
auto Forward(const char* name, Arguments... arguments)
{
    using Result = decltype(Function(arguments...));
    static const auto engine = reinterpret_cast<decltype(Function)>(dlsym(RTLD_NEXT, name));
    detail::Call call(name);
    if (call.Recorded())
    {
        call.Write(arguments...);
    }
    if constexpr (std::is_void_v<Result>)
    {
        engine(arguments...);
    }
    else
    {
        const Result result = call.Refused() ? Result() : engine(arguments...);
        if (call.Recorded())
        {
            call.WriteResult(result);
        }
        return result;
    }
}

/** Records a call that is answered with @p result without the engine. */
template <class Result, class... Arguments>
Result Answer(const char* name, Result result, Arguments... arguments)
{
    detail::Call call(name);
    if (call.Recorded())
    {
        call.Write(arguments...);
        call.WriteResult(result);
    }
    return result;
}

} // namespace kxtest

#endif
