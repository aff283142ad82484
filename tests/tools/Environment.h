#ifndef KX_TESTS_TOOLS_ENVIRONMENT_H
#define KX_TESTS_TOOLS_ENVIRONMENT_H

#include <map>
#include <optional>
#include <string>
#include <vector>

#include <stdlib.h>

namespace kxtest
{

/** Changes the environment of this process for the object's life; KX_LOG_MASK is unset in it. */
class Environment
{
public:
    /** @param settings  "NAME=value" each. */
    explicit Environment(const std::vector<std::string>& settings)
    {
        Set("KX_LOG_MASK", std::nullopt);
        for (const std::string& setting : settings)
        {
            const auto end = setting.find('=');
            Set(setting.substr(0, end), setting.substr(end + 1));
        }
    }

    ~Environment()
    {
        for (const auto& [name, value] : m_former)
        {
            Change(name, value);
        }
    }

    Environment(const Environment&) = delete;
    Environment& operator=(const Environment&) = delete;

private:
    using Value = std::optional<std::string>;

    void Set(const std::string& name, const Value& value)
    {
        const char* const former = getenv(name.c_str());
        m_former.emplace(name, former == nullptr ? Value() : Value(former));
        Change(name, value);
    }

    static void Change(const std::string& name, const Value& value)
    {
        if (value)
        {
            setenv(name.c_str(), value->c_str(), 1);
        }
        else
        {
            unsetenv(name.c_str());
        }
    }

    std::map<std::string, Value> m_former;
};

} // namespace kxtest

#endif
