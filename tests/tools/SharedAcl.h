#ifndef KX_TESTS_TOOLS_SHAREDACL_H
#define KX_TESTS_TOOLS_SHAREDACL_H

#include <initializer_list>
#include <string>

namespace kxtest
{

inline const char* const g_acl = "system.posix_acl_access";

inline std::string Bytes(std::initializer_list<int> bytes)
{
    return {bytes.begin(), bytes.end()};
}

/** What "setfacl -m u:65534:rw" makes of mode 640: the mask lets the named user read and write. */
inline const std::string g_sharedAcl = Bytes({2, 0, 0, 0}) +                  // version
                                       Bytes({1, 0, 6, 0, -1, -1, -1, -1}) +  // owner rw
                                       Bytes({2, 0, 6, 0, -2, -1, 0, 0}) +    // user 65534 rw
                                       Bytes({4, 0, 4, 0, -1, -1, -1, -1}) +  // group r
                                       Bytes({16, 0, 6, 0, -1, -1, -1, -1}) + // mask rw
                                       Bytes({32, 0, 0, 0, -1, -1, -1, -1});  // others

} // namespace kxtest

#endif
