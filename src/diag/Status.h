#ifndef KX_DIAG_STATUS_H
#define KX_DIAG_STATUS_H

namespace kx
{

/**
 * The status codes that the library's operations return.
 *
 * 7 and 22 share their numbers with errno values of the platform, but are never stored in errno.
 * Clients compare with the plain numbers.
 */
enum Status
{
    /** Success; also for a key path that starts with another name than the root's. */
    StatusOk = 0,
    /** A bad argument or an unmet precondition: a key path without ".", an empty path or name. */
    StatusBadArgument = 7,
    /** A missing object (document, root, node, attribute) or an engine call that failed. */
    StatusMissing = 22,
    /** Not found or not done: no value under the key, nothing updated, a file not written. */
    StatusNotFound = -2
};

} // namespace kx

#endif
