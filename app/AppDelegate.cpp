#include "app/AppDelegate.h"

namespace pyx {

bool AppDelegate::applicationDidFinishLaunchingWithOptions(const Dict& launchOptions) {
    // The launch options are taken as a dictionary and otherwise not used.
    const Dict options = launchOptions;
    (void)options;
    return true;
}

}  // namespace pyx
