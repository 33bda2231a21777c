// Shows boxes and windows to a person.
#pragma once

namespace kest::desktop {

/// Lets a person answer: boxes and input boxes are real windows, and windows wait for their user.
void usePerson();
/// If a person answers, lets long operations show what they wait for.
void showWaits();

}  // namespace kest::desktop
