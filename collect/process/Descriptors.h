// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <vector>

namespace NQRVZEP20 {

struct TPipe {
  TUniqueFd fReadEnd, fWriteEnd;
};

// Throws std::system_error if no pipe can be created. The read end is non-blocking. Both ends are 3 or above, even if standard
// descriptors are closed.
TPipe OpenPipe();

// Closes all descriptors of this process from 3 up, except `kept`.
void CloseAllBut(std::vector<int> kept);

// Redirects the descriptor to the null device, for reading and writing; closes it if the null device cannot be opened.
void MakeNull(int fd);

}  // namespace NQRVZEP20
