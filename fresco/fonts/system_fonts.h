// Font files that the client names in the library's option string: "--system-fonts=PATH:PATH:...", ended by a
// blank or the end of the string. They are opened through the client's file access, and only when a search by
// name finds nothing without them: a page that brings its own fonts costs no file access.
#pragma once
#include <fresco/file_manipulator.h>
#include <string>
#include "fresco/fonts/font_data.h"

namespace fresco {

class SystemFonts {
  public:
    void SetOptions(const char* options);
    void SetFiles(IFileManipulator* files) { files_ = files; }

    // Opens every file that was not opened yet and hands it to `use`. False when there was none left.
    template <class Use>
    bool Open(Use&& use) {
        if (!files_ || paths_.empty()) return false;
        const Vector<String> paths = std::move(paths_);
        paths_.clear();
        for (const String& path : paths) {
            StreamPtr reader(files_->OpenFile(path.c_str()));
            reader ? use(std::move(reader)) : ReportMissing(path.c_str());
        }
        return true;
    }

  private:
    using String = std::basic_string<char, std::char_traits<char>, StdAllocator<char>>;
    static void ReportMissing(const char* path);

    IFileManipulator* files_ = nullptr;
    Vector<String> paths_;  // not opened yet
};

}  // namespace fresco
