// Where primes.txt and primes.ini live and where README.txt is read from.
// A portable copy (its program folder writable, not laid out as an installation) keeps its files
// beside the program. An installed copy (the program in a "bin" folder next to "share", as
// `cmake --install` and the Debian package lay it out) or a copy in a folder the user cannot write
// keeps them in the user's data folder, and reads README.txt from the installed documentation.
#pragma once

#include <functional>
#include <optional>
#include <string>

namespace tarn {

// What decides the folder, taken from the running process by `currentSurroundings` and set by
// hand in tests.
struct Surroundings {
    std::function<bool(const std::string& folder)> folderWritable;
    // XDG_DATA_HOME and HOME (Windows: LOCALAPPDATA and USERPROFILE); nullopt when unset.
    std::optional<std::string> xdgDataHome;
    std::optional<std::string> home;
};
Surroundings currentSurroundings();

// Whether this process may create files in the folder (effective ids; read-only mounts count).
bool isFolderWritable(const std::string& folder);

// Whether the program folder is the "bin" folder of an installation prefix.
bool isInstalledLayout(const std::string& programFolder);

// The user's data folder for Tarn with one trailing separator: $XDG_DATA_HOME/tarn, else
// $HOME/.local/share/tarn (Windows: %LOCALAPPDATA%\Tarn). A relative XDG_DATA_HOME is ignored, as
// the XDG base directory rules demand. Empty when neither variable gives a folder.
std::string userDataFolder(const Surroundings& env);

// The folder of primes.txt and primes.ini, one trailing separator; only decides, creates nothing.
// Falls back to the program folder when no user data folder can be named.
std::string chooseDataFolder(const std::string& programFolder, const Surroundings& env);

// The same for the running process; a user data folder is created when missing (a failure to
// create it shows up later, when a file cannot be written there).
std::string dataFolder(const std::string& programFolder);

// README.txt of the program folder when there, else the installed documentation's copy
// (<bin>/../share/doc/tarn/README.txt), else the program folder's name for it, which does not
// exist, so that "Readme" then does nothing.
std::string readmePath(const std::string& programFolder);

}  // namespace tarn
