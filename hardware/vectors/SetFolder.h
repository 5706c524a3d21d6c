// SetFolder: the folder of a set of vectors, which is replaced as a whole.
#ifndef MORVIK_HARDWARE_VECTORS_SETFOLDER_H
#define MORVIK_HARDWARE_VECTORS_SETFOLDER_H

#include <string>
#include <vector>

#include "base/OwnFile.h"

namespace morvik::vectors {

/// Replaces the set in a folder. Files that are not part of a set stay. All functions throw base::Error.
///
/// A new set is made aside, in a hidden subfolder. When it is complete, the files of the earlier one move aside and the
/// new ones take their place. The manifest leaves first and arrives last: without it, there is no set. If a step fails,
/// the earlier files move back. A killed process leaves the earlier set or the new one or, if killed while it moved the
/// files, none: the next process then finishes the move. Anything else left by a killed process is removed.
class SetFolder {
public:
    /// Makes the folder if needed. Throws unless it is empty or holds an earlier set, or while another process makes a
    /// set in it.
    explicit SetFolder(std::string path);
    SetFolder(const SetFolder&) = delete;
    SetFolder& operator=(const SetFolder&) = delete;

    /// Removes what has not been placed.
    ~SetFolder();

    /// Where to make the files of the new set, the manifest last.
    const std::string& aside() const;

    /// Replaces the earlier set by the new one. Throws, and keeps the earlier one, if something else has the name of a
    /// file of either, or a file cannot be moved.
    void place();

private:
    /// A folder, made if needed. If this process owns it, the destructor removes it if it is empty.
    struct Made {
        explicit Made(std::string folder);
        Made(const Made&) = delete;
        Made& operator=(const Made&) = delete;
        ~Made();

        std::string path;
        bool isOwn;
    };

    void finishEarlier();
    void moveAll() const;
    void moveBack() const;
    void clearAside() const;
    void expectOwnAside() const;
    void expectSetOrNothing() const;
    void expectMovable() const;
    std::vector<std::string> earlierFiles() const;

    /// The path of a file in the folder, aside, or aside as part of the earlier set.
    std::string placed(const std::string& name) const;
    std::string made(const std::string& name) const;
    std::string earlier(const std::string& name) const;

    Made itsFolder;
    Made itsAside;
    base::OwnFile itsLock;
};

/// The path of a file in a folder.
std::string pathIn(const std::string& folder, const std::string& name);

/// Throws if a killed process has left a set half placed.
void expectPlaced(const std::string& folder);

}  // namespace morvik::vectors

#endif
