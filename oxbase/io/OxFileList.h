// OxFileList.h: the names of the files to be processed.
//
// Names come one at a time through add, or in bulk from list files: plain
// text files with one name per line, "#" comments, double quotes that
// protect a "#", and white space trimmed at both ends. A name that denotes a
// directory is expanded by a tree walk whose callback decides which of its
// files enter the list.
//
//   OxFileList list("parts.lst");
//   list.setFTWCallback(keepAll);          // needed before directories are added
//   if (list.readListFiles() == OxTrue) use(list.getFileNameList());
//
// The list owns every name it holds. A list file that cannot be opened is
// reported on standard error (not through OxMsg).
#ifndef OXBASE_IO_OXFILELIST_H
#define OXBASE_IO_OXFILELIST_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/core/OxGList.h"
#include "oxbase/core/OxTypes.h"
#include "oxbase/io/OxFileTreeWalk.h"

class OXBASE_API OxFileList {
public:
    /// Empty lists, no second-choice path, no callback.
    OxFileList();
    /// As above, and a copy of `listFile` becomes the first list file unless
    /// it is null or empty.
    explicit OxFileList(const char* listFile);
    OxFileList(const OxFileList&) = delete;
    OxFileList& operator=(const OxFileList&) = delete;
    /// Frees the path and every name of both lists.
    virtual ~OxFileList();

    /// A name that is no directory (or whose status cannot be read) enters
    /// the list as a copy with white space at both ends removed; an empty
    /// result adds nothing. A directory is walked (10 stream slots, no depth
    /// limit) with the tree-walk callback, which gets the list of file names
    /// (`OxGList<char *> *`) as user data and appends OxString::dup copies.
    /// A null name, or a directory while no callback is set, adds nothing.
    void add(const char* name);
    /// Appends a copy to the list files; null or empty adds nothing. Nothing
    /// is read yet.
    void addListFile(const char* name);
    /// The directory in which list files are searched as a second choice;
    /// null or empty clears it.
    void setListFilePath(const char* path);
    void setFTWCallback(OxFileTreeWalkCallback callback) { ftwCallback = callback; }

    /// Reads every list file in order and adds its entries. OxFalse at the
    /// first list file that cannot be opened, after two lines on standard
    /// error ("Unable to open list file." and what was tried); names added
    /// before stay. A line of more than 519 characters ends the reading of
    /// its file silently.
    OxBool readListFiles();

    const OxGList<char*>& getFileNameList() const { return fileNames; }
    /// The list files in the order given.
    const OxGList<char*>& getListFiles() const { return listFiles; }
    const char* getListFilePath() const { return listFilePath; }

    /// Whether the first character is "#"; `text` must not be null.
    OxBool isComment(const char* text) const;
    /// OxTrue for null and for text of nothing but white space; OxFalse for a
    /// zero-length text.
    OxBool isEmpty(const char* text) const;
    /// Cuts `text` at the first "#" outside double quotes, in place; returns it.
    char* stripComment(char* text);

    /// Writes the frame lines, the list files and the file names, one per line.
    std::ostrstream* dump(std::ostrstream* s) const;

protected:
    /// Opens, reads and closes one list file; false when it cannot be opened.
    bool readListFile(const char* name);

    char* listFilePath = nullptr;
    OxGList<char*> listFiles;
    OxGList<char*> fileNames;
    OxFileTreeWalkCallback ftwCallback = nullptr;
};

#endif
