#pragma once

/// Does nothing. Calling it makes the linker take the object file with our operator new from its archive, also where
/// another one (a sanitizer's) would do.
void USE_REPLACED_NEW();
