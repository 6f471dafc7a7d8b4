#include "decompress/decompressor_state.h"

DecompressorState& Decompressor() {
    // Built on first use, so it is ready whenever another static object's constructor decompresses.
    static DecompressorState state;
    return state;
}
