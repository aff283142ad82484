#ifndef KX_FUZZ_CONFINEDENGINE_H
#define KX_FUZZ_CONFINEDENGINE_H

// The engine as fuzz targets want it: silent, and confined to the files that they made.

namespace kxfuzz
{

/**
 * Called by LLVMFuzzerInitialize(). From then on the engine prints nothing, and the process aborts
 * if it is about to read anything but a file in memory: no document may make the library do that.
 *
 * @param allowsCurrentFolder  whether it may read files in the current folder, too.
 */
void ConfineEngine(bool allowsCurrentFolder = false);

} // namespace kxfuzz

#endif
