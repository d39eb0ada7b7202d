#include "frame/scratch.h"

// Process attach. Runs after the static initialisers that have a priority, so these take their
// memory before it.
__attribute__((constructor)) static void AttachProcess() { qx::AttachScratchHeap(); }
