// SetFolder: the folder of a set of vectors, which gets a new set as a whole.
#ifndef MORVIK_HARDWARE_VECTORS_SETFOLDER_H
#define MORVIK_HARDWARE_VECTORS_SETFOLDER_H

#include <string>
#include <vector>

#include "base/OwnFile.h"

namespace morvik::vectors {

/// Files that are not of a set stay as they are. Everything throws base::Error.
///
/// A new set is made aside, in a hidden folder within. When it is complete, the files of the earlier one go aside, too,
/// and the new ones take their place. The manifest goes first and comes last: without it, there is no set. If a step
/// fails, the earlier ones go back. A process that is killed leaves the earlier set or the new one, or, if that was
/// while it moved the files, none: then the next one finishes it. What else a killed one has left is removed.
class SetFolder {
public:
    /// Makes the folder if it is not there. Throws unless it is empty or holds an earlier set, and while another
    /// process makes a set in it.
    explicit SetFolder(std::string path);
    SetFolder(const SetFolder&) = delete;
    SetFolder& operator=(const SetFolder&) = delete;

    /// What has not been placed goes.
    ~SetFolder();

    /// Where the files of the new set are to be made, the manifest last.
    const std::string& aside() const;

    /// Puts the new set in the place of the earlier one. Throws, and leaves that, where something else has the name of
    /// a file of either, or a file cannot be moved.
    void place();

private:
    /// A folder, made if it is not there. If it is this process's, it goes at the end when nothing is in it.
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

    /// The path of what is in the folder, aside, or aside as a file of the earlier set.
    std::string placed(const std::string& name) const;
    std::string made(const std::string& name) const;
    std::string earlier(const std::string& name) const;

    Made itsFolder;
    Made itsAside;
    base::OwnFile itsLock;
};

/// Throws where a killed process has left a set that is half placed.
void expectPlaced(const std::string& folder);

}  // namespace morvik::vectors

#endif
