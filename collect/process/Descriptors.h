// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "core/Handles.h"

#include <vector>

namespace NQRVZEP20 {

struct TPipe {
  TUniqueFd fReadEnd, fWriteEnd;
};

// Throws std::system_error when there is no pipe. The read end does not block.
TPipe OpenPipe();

// Closes every descriptor of this process from 3 up, except these.
void CloseAllBut(std::vector<int> kept);

// Makes a descriptor the null device, for reading and writing.
void MakeNull(int fd);

}  // namespace NQRVZEP20
