// SPDX-License-Identifier: MIT
// What an attack may have reached. Each looks at a world that was stopped.
#pragma once

#include "world.h"

namespace aims {

bool vaultIsEmpty(World& world);
bool vaultIsGone(World& world);
bool secretIsTold(World& world);
bool answersTheQuestion(World& world);
bool connectionIsReadOnly(World& world);
bool transactionIsOpen(World& world);
bool noteIsForged(World& world);
bool everyNoteIsDeleted(World& world);
bool noteTwoIsDeleted(World& world);
bool noteTwelveIsDeleted(World& world);
bool everyNoteIsTold(World& world);
bool thousandsAreTold(World& world);
bool annIsImitated(World& world);
bool annIsTold(World& world);
bool authorIsAnother(World& world);
bool hostIsThrownAt(World& world);
// The next id is beyond 32 bits.
bool idsAreUsedUp(World& world);
bool noteIsEves(World& world);
bool newNoteIsChanged(World& world);
bool crowdGrows(World& world);
// The call succeeded, and the member is null.
bool topicsAreLost(World& world);
bool noteIsHuge(World& world);
bool noteHasManyValues(World& world);
bool answerIsHuge(World& world);
bool authorIsNoUtf8(World& world);
bool logLineIsForged(World& world);
// A character that a terminal or a log viewer obeys.
bool logHasControls(World& world);
// More steps than the fence would give a call.
bool tableIsScanned(World& world);
bool sqliteIsBusy(World& world);

}  // namespace aims
