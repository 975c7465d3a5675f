#include <iostream>

#include "cli/cli_context.hpp"

namespace tarn::cli {

std::optional<FolderLock> lockFolder(Context& ctx) {
    FolderLock lock = FolderLock::tryTake(ctx.folder);
    if (lock.busy()) {
        std::cerr << folderBusyMessage(ctx.folder) << '\n';
        ctx.exitCode = kRefused;
        return std::nullopt;
    }
    return lock;
}

}  // namespace tarn::cli
