// SPDX-License-Identifier: Apache-2.0
#pragma once

#include "Link.h"
#include "providers/reasons/TComputerSystem.h"
#include "providers/reasons/TRecord.h"

namespace NQRVZEP20 {

bool IsBond(TLink const& link);

// ZEP_Bond: the members of a bond as a set that stays in operation when one of them fails.
TRecord BondRecord(TMachineFiles const& files, TLink const& bond, TLinks const& links);

// ZEP_BondMember: the use of an interface by a bond.
TRecord BondMemberRecord(TMachineFiles const& files, TLink const& member, TLinks const& links, TComputerSystem const& system);

// The interfaces whose master is this one.
std::vector<TLink const*> MembersOf(TLink const& master, TLinks const& links);

}  // namespace NQRVZEP20
