// OxXmlFileList.h: a file list that keeps the ".xml" files of directories.
//
// OxXmlFileList is an OxFileList whose tree-walk callback keeps, of the
// files found below a directory, those whose last "." starts ".xml". Plain
// names given to add or read from a list file enter the list untested.
//
//   OxXmlFileList list;
//   list.add("data/parts");                 // the .xml files below it
//   const OxGList<char *> & names = list.getFileNameList();
#ifndef OXBASE_DOC_OXXMLFILELIST_H
#define OXBASE_DOC_OXXMLFILELIST_H

#include "oxbase/platform/OxExport.h"

#include "oxbase/io/OxFileList.h"

class OXBASE_API OxXmlFileList : public OxFileList {
public:
    /// As OxFileList(), with the ".xml" filter as the tree-walk callback.
    OxXmlFileList();
    /// As OxFileList(listFile), with the same filter.
    explicit OxXmlFileList(char const* listFile);
    ~OxXmlFileList() override;

private:
    friend class OxXmlFileListTestAccess;

    /// The callback: for an OxFTWFile whose path has a "." after its first
    /// character and the four characters from the last such "." are ".xml",
    /// a copy of the path is appended to `list` (an OxGList<char *>). Always
    /// 0, except -1 for a null list (which stops the walk).
    static int filterXMLFileList(char const* path, OxStat const* status, OxFileTreeWalkType type,
                                 void* list);
};

#endif
