#pragma once

namespace fotomill {

// One flag for the whole process: set by the Abort button of a progress box or by whoever asks the program to end, cleared
// whenever a progress box opens. Functions test it between files; what is in work is finished, nothing new is begun.
void ClearAbort();
void Abort();
// Whether the batch is to stop: the flag, or the system's request to end the program.
bool AbortAsked();

}  // namespace fotomill
