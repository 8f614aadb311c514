# Checks the exported interface of the shared library against what the
# library promises: every public class, the public free functions and static
# data are there, and no helper of namespace oxbase::detail is, except those
# exported on purpose.
#
# ELF: the dynamic symbols of liboxbase.so (nm -D --defined-only --demangle).
# Windows: the symbols of the DLL's import library (nm --defined-only
# --demangle liboxbase.dll.a), which names exactly what the DLL exports.
#
#   cmake -DNM=nm -DLIBRARY=build/dev/liboxbase.so -DFORMAT=elf -P tests/install/CheckExports.cmake
cmake_policy(VERSION 3.25)

foreach(var NM LIBRARY FORMAT)
    if(NOT DEFINED ${var})
        message(FATAL_ERROR "CheckExports: ${var} is not set")
    endif()
endforeach()

if(FORMAT STREQUAL "elf")
    execute_process(COMMAND "${NM}" -D --defined-only --demangle "${LIBRARY}"
        RESULT_VARIABLE result OUTPUT_VARIABLE listing ERROR_VARIABLE errors)
else()
    # Every export has its __imp_ pointer in the import library (data has
    # nothing else); those names, without the prefix, demangled by c++filt.
    execute_process(COMMAND "${NM}" --defined-only "${LIBRARY}"
        RESULT_VARIABLE result OUTPUT_VARIABLE raw ERROR_VARIABLE errors)
    string(REGEX MATCHALL "__imp_[^\n]+" imports "${raw}")
    list(TRANSFORM imports REPLACE "^__imp_" "")
    list(REMOVE_DUPLICATES imports)
    list(JOIN imports "\n" mangled)
    get_filename_component(work "${LIBRARY}" DIRECTORY)
    file(WRITE "${work}/exports.mangled" "${mangled}\n")
    find_program(CXXFILT NAMES c++filt REQUIRED)
    execute_process(COMMAND "${CXXFILT}" INPUT_FILE "${work}/exports.mangled"
        OUTPUT_VARIABLE demangled)
    string(REPLACE "std::basic_ostream<char, std::char_traits<char> >" "std::ostream"
        demangled "${demangled}")
    # The same layout as nm's lines: address, type letter, name.
    string(REGEX REPLACE "([^\n]+)" "0 I \\1" listing "${demangled}")
endif()
if(NOT result EQUAL 0)
    message(FATAL_ERROR "CheckExports: ${NM} failed on ${LIBRARY} (${result}): ${errors}")
endif()

# One name a line, without address and type letter. Brackets and semicolons
# of demangled names would upset CMake's lists, so they are replaced first.
string(REPLACE ";" "<semicolon>" listing "${listing}")
string(REPLACE "[" "<" listing "${listing}")
string(REPLACE "]" ">" listing "${listing}")
string(REPLACE "\n" ";" lines "${listing}")
set(symbols "")
foreach(line IN LISTS lines)
    if(line MATCHES "^[0-9a-fA-F]* *[A-Za-z] (.+)$")
        list(APPEND symbols "${CMAKE_MATCH_1}")
    endif()
endforeach()
list(LENGTH symbols count)
if(count LESS 100)
    message(FATAL_ERROR "CheckExports: only ${count} symbols in ${LIBRARY}: not the library?")
endif()

# Helpers of namespace oxbase::detail that the public headers call from
# inline code, and which must therefore be exported:
#  - reportListRange: the out-of-range report of the header-only OxGList.
set(deliberate "oxbase::detail::reportListRange(unsigned int, unsigned int)")
set(failures "")
foreach(symbol IN LISTS symbols)
    # A symbol of the namespace itself; a private member of a public class
    # that merely takes a helper type is exported with its class.
    if(symbol MATCHES "^((typeinfo|typeinfo name|vtable|VTT|guard variable) for )?oxbase::detail::"
       OR symbol MATCHES "^[^(]*anonymous namespace")
        if(NOT symbol IN_LIST deliberate)
            string(APPEND failures "  internal helper exported: ${symbol}\n")
        endif()
    endif()
endforeach()

# The public classes: each has members or type information in the export.
set(classes
    HashTable OxName OxString OxSystem OxType
    OxCounter OxCounters OxFlavor OxFlavorEntry OxHeapInfo OxMsg OxPrt
    OxFile OxFileList OxFileTreeWalk OxInodeDevice OxInodeTable OxInput OxMemory OxOutput
    OxCsvFile OxXmlAttribute OxXmlElement OxXmlFile OxXmlFileList
    OxBBox OxBBoxf OxBRect OxBSphere OxBSpheref OxColor OxLimits OxLine OxMatrix OxPlane
    OxRot OxRot2d OxVec2d OxVec3d OxVec4d
    OxRangeList)
foreach(class IN LISTS classes)
    set(found FALSE)
    foreach(symbol IN LISTS symbols)
        if(symbol MATCHES "(^| )${class}::" OR symbol MATCHES "^(typeinfo|vtable) for ${class}$")
            set(found TRUE)
            break()
        endif()
    endforeach()
    if(NOT found)
        string(APPEND failures "  public class not exported: ${class}\n")
    endif()
endforeach()

# Free functions and static data of the interface.
set(required
    "swapd(double)"
    "swapf(float)"
    "OxPrtInit()"
    "oxIndent(std::ostrstream&)"
    "OxMsgLibraryNumber(unsigned int)"
    "OxMsgLibraryArguments(unsigned int)"
    "operator+(OxVec3d const&, OxVec3d const&)"
    "operator<<(std::ostream&, OxVec3d const&)"
    "operator==(OxBBox const&, OxBBox const&)"
    "operator*(OxRot const&, OxRot const&)"
    "OX_IDENTITY_3X3_MATRIX"
    "OxPrt::curpos"
    "OxName::table"
    "OxCsvFile::OX_CSV_COMMENT_START"
    "OxXmlFile::OX_XML_FIELD_VEC3D")
foreach(name IN LISTS required)
    if(NOT name IN_LIST symbols)
        string(APPEND failures "  not exported: ${name}\n")
    endif()
endforeach()

if(failures)
    message(FATAL_ERROR "CheckExports: ${LIBRARY}:\n${failures}")
endif()
list(LENGTH classes class_count)
message(STATUS "CheckExports: ${count} symbols; ${class_count} public classes present; "
               "oxbase::detail exports only: ${deliberate}")
