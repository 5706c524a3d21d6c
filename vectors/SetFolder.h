// SetFolder: the folder of a set of vectors, which gets a new set as a whole.
#ifndef MORVIK_VECTORS_SETFOLDER_H
#define MORVIK_VECTORS_SETFOLDER_H

#include <string>

#include "simulation/OwnFile.h"

namespace morvik::vectors {

/// Files that are not of a set stay as they are. Everything throws simulation::Error.
///
/// A new set is made aside, in a hidden folder within, and is moved when it is complete. The manifest goes first and
/// comes last: without it, there is no set. A process that is killed leaves the earlier set, or, if that was while it
/// moved the files, no set; the next one finishes what can be finished and removes the rest.
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

    /// Puts the new set in the place of the earlier one. Throws, and leaves that, if the folder has another file of the
    /// name of a new one.
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
    void clearAside() const;
    void expectSetOrNothing() const;
    void expectOwnNames() const;

    Made itsFolder;
    Made itsAside;
    simulation::OwnFile itsLock;
};

}  // namespace morvik::vectors

#endif
