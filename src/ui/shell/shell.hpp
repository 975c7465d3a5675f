// The platform shell: the programs and folders the window hands work to. Each call starts the
// other program without waiting and answers with an empty text on success, or the reason it
// failed, which the window reports in an "Info" message.
#pragma once

#include <string>

namespace tarn::ui {

class Shell {
public:
    virtual ~Shell() = default;
    // The desktop's text editor with the file.
    virtual std::string openInTextEditor(const std::string& path) = 0;
    // Lets the user pick the program that opens the file.
    virtual std::string showOpenWith(const std::string& path) = 0;
    // The default web browser with the address.
    virtual std::string openUrl(const std::string& url) = 0;
    // The user's documents folder, without a trailing separator unless it is a root.
    virtual std::string documentsFolder() = 0;
};

}  // namespace tarn::ui
