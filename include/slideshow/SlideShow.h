// One slide show: pictures in a container file, or only noted by path and size in memory.
//
// A show in file mode lives in a container (docs/container.md): music, settings and up to 20 pictures,
// each stored as a JPEG no larger than the show needs. Every operation opens the container by `pathName`
// and closes it before it returns, so no stream stays open between calls. A show in memory mode has no
// file: it notes up to 1024 pictures, which are decoded from their source each time.
//
// One caller at a time; no locks, no logging.
//
// An addition, insertion or removal that answers 0 leaves the object as it was, and puts the file back
// as it was; only what was to be removed may be damaged, see RemoveSubfile. The way back writes to the
// same storage. It repeats a step that fails; when that fails again too, the file may be neither the old
// one nor the new one, and may not open.
#ifndef SLIDESHOW_SLIDESHOW_H
#define SLIDESHOW_SLIDESHOW_H

#include <cstdio>

// One picture of a show.
struct subfileInfo {
  char name[256] = {};         // the application's name for it; always terminated, may be empty
  char path[256] = {};         // source file; empty for pictures added from a byte buffer
  int flag = 0;                // 0 to 255, from the add or insert; 1 from the public operations
  FILE* sourceFile = nullptr;  // always null: the codec opens the source itself
  int reserved = 0;
  int width = 0;  // pixels: of the stored JPEG in file mode, of the source in memory mode
  int height = 0;
  int state = 0;   // 0 added, 2 loaded from the file; bit 0 set when marked for removal
  int size = 0;    // bytes of header and JPEG data in the container; 0 in memory mode
  int offset = 0;  // of the header in the container
};

// The fields of a show, in the order that the Java bridge and native callers rely on.
struct SlideShowFields {
  char pathName[256] = {};   // container file; always terminated
  char musicName[256] = {};  // music file that was copied into the container
  FILE* file = nullptr;      // the container's stream while an operation runs
  int mode = 0;              // SlideShow::kFree, kFileMode or kMemoryMode
  int width = 0;             // target size of the show, pixels
  int height = 0;
  int lastIndex = -1;           // picture drawn last, -1 before the first
  int musicSize = 0;            // bytes of music, also the offset of the container's header
  int subfileCount = 0;         // pictures
  int subfileOffsets[20] = {};  // file mode: subfiles[i].offset, 0 behind the last
  int interval = 1;             // settings; their units and codes are the application's
  int effectType = 0;
  int shuffle = 0;                  // 0 or 1
  int loop = 0;                     // 0 or 1
  int screenDirection = 0;          // 0 or 1
  subfileInfo* subfiles = nullptr;  // 20 (file mode) or 1024 (memory mode) entries, owned
};

class SlideShow : public SlideShowFields {
 public:
  // Values of `mode`.
  static constexpr int kFree = 0;
  static constexpr int kFileMode = 1;
  static constexpr int kMemoryMode = 2;

  // Results of creating, opening and deleting besides 1 and 0; Java sees negative numbers.
  static constexpr int kGeneralFailure = static_cast<int>(0x80000001U);
  static constexpr int kBadHandle = static_cast<int>(0x80000002U);
  static constexpr int kNotContainer = static_cast<int>(0x80000003U);
  static constexpr int kWrongVersion = static_cast<int>(0x80000004U);

  // Most pictures of a show.
  static constexpr int kMaxFileSubfiles = 20;
  static constexpr int kMaxMemorySubfiles = 1024;

  SlideShow() = default;
  ~SlideShow();
  SlideShow(const SlideShow&) = delete;
  SlideShow& operator=(const SlideShow&) = delete;

  // ---- creating, opening, ending ----

  // Starts a show of a target size. With a path (1 to 255 bytes) a new container replaces the file there
  // and holds its header alone until the first picture is added; with null the show is in memory. An
  // earlier show in this object ends first. Returns 1; 0 for a bad size or path (the object keeps its
  // show); kGeneralFailure when memory is short or the file cannot be written (the object is free).
  int CreateShow(const char* path, int showWidth, int showHeight);

  // Opens a container. Its header replaces the path, size and settings given so far. Returns 1, or with
  // the object free: kNotContainer (no end mark), kWrongVersion, kGeneralFailure (bad arguments,
  // missing, read-only, cut short or inconsistent file, no memory).
  int OpenShow(const char* path, int showWidth, int showHeight);

  // Ends the show: the object is free again, the container stays as it is. Returns 1.
  int DeleteShow();

  // ---- settings and facts ----

  // File mode: renames the show, that is writes its header, with the new path in it, into the existing
  // file at `path` (1 to 255 bytes). 1, or 0; a valid path stays set even when the write fails.
  int SetPathName(const char* path);

  // Copies a path with its terminator (`buffer` holds 256 bytes) and returns its length: the container's
  // in file mode, that of the picture drawn last in memory mode. 0 when there is none.
  int GetLastInformation(char* buffer) const;

  // Bytes of music; 0 when there is none.
  int GetMusicSize() const;

  // Bytes of picture `index`'s JPEG data; 0 for a free object or a bad index. In memory mode nothing is
  // stored and the value (-540) means nothing.
  int GetSizeOfSubfile(int index) const;

  // ---- adding pictures ----
  // In any format that the codec reads. File mode stores a JPEG of the display size at quality 100;
  // memory mode notes size and path. `name` may be null and is cut at 255 bytes. `data` stays the
  // caller's, but a decoder may rework it in place. 1, or 0: free object, show full, missing source,
  // path not 1 to 255 bytes, unreadable or unsupported picture, no memory, container not writable.

  int AddImageToFile(const char* imagePath, const char* imageName);
  int AddImageToBuffer(void* data, int length, const char* imageName);

  // The same in front of picture `position`; `subfileCount` appends, other positions are refused.
  int InsertImageToFile(const char* imagePath, const char* imageName, int position);
  int InsertImageToBuffer(void* data, int length, const char* imageName, int position);

  // The steps of the above; the insertions take 0 <= position < subfileCount.
  int AddFile(const char* imagePath, const char* imageName, char imageFlag);
  int AddBuffer(void* data, int length, const char* imageName, char imageFlag);
  int InsertFile(const char* imagePath, const char* imageName, int position, char imageFlag);
  int InsertBuffer(void* data, int length, const char* imageName, int position, char imageFlag);

  // ---- removing pictures ----
  // File mode only. Removing goes in two phases, so that several pictures go at the price of one.

  // Marks picture `index`: nothing is written, and it can still be drawn. 1, or 0 for a bad index.
  int RemoveImage(int index);

  // `state` of picture `index`; 0 as well for a bad index and in memory mode.
  int GetImageState(int index) const;

  // Takes the marked pictures out of the file: moves the others together, rewrites the headers and cuts
  // the file. The rest keeps its order, its indices begin at 0; each gets the name, path and state that
  // its header in the file holds. 1, or 0 with the object as it was, all marks included, and the file
  // put back as said above. A step that fails once is repeated; when it fails again after pictures have
  // moved, the marked ones may have lost their data, even where the way back succeeds.
  int RemoveSubfile();

  // ---- music ----

  // Takes in a music file (1 byte to 2 GiB): file mode copies it in front of everything else, memory
  // mode notes its path and size. Needs memory for the longest picture's data or 131,072 bytes,
  // whichever is more, and 16 KB. 1, or 0 with the file put back as said above: music is there already,
  // path not 1 to 255 bytes, no file, an empty one, no memory, container not writable or too large.
  int AddMusic(const char* musicPath);

  // Takes the music out again. 1, or 0 as for RemoveSubfile: the music may be damaged when a step fails
  // twice. 0 also when there is none.
  int RemoveMusic();

  // Copies the path of the music with its terminator (`buffer` holds 256 bytes) and returns its length;
  // 0 when there is none.
  int GetMusic(char* buffer) const;

  // ---- getting pictures back ----

  // Display size: the picture's own, reduced in proportion where a landscape or square picture is wider
  // or a portrait one higher than the show. 0 for a free object or a bad index.
  int GetSubWidth(int index) const;
  int GetSubHeight(int index) const;

  // File mode: reads picture `index`'s JPEG data; `buffer` holds GetSizeOfSubfile(index) bytes. 1 or 0.
  int GetImage(int index, void* buffer);
  int GetSubfile(int index, void* buffer);

  // Decodes picture `index` into packed 32-bit pixels (bytes B, G, R, A), fitted into width x height and
  // centred on transparent black. `pixels` holds width * height words. 1 (and lastIndex = index), or 0;
  // once the source could be opened a failure leaves `pixels` cleared or partly written.
  int GetDrawble(int index, void* pixels, int drawWidth, int drawHeight);

  // Memory mode: the same from the encoded picture in `bytes`; lastIndex stays.
  int GetDrawbleToBuffer(void* bytes, int length, void* pixels, int drawWidth, int drawHeight);

  // ---- writers: file mode only, 1 or 0, refused while `file` is open ----

  // The 628-byte header at musicSize. "r+b" rewrites it, "w+b" or "a+b" creates the file.
  int writeVssHeader(const char* openMode);
  // The 540-byte header of every picture, in place.
  int writeSubfileHeader();
  // Picture `index` whole: header and size - 540 bytes of JPEG data, at its offset.
  int writeSubfile(int index, const void* data);
  // The 12-byte end mark, behind whatever the file holds.
  int writeEndMark();

 private:
  // Frees the entries and puts every field back to its initial value.
  void reset();
  // Replaces the entries by `count` empty ones; false when memory is short.
  bool allocateEntries(int count);
  // Reads end mark, header and picture headers; 1 or a failure code.
  int readContainer();
};

#endif
