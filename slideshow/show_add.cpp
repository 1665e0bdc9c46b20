// Adding pictures behind the last one, and inserting them in front of others.
#include "slideshow/SlideShow.h"
#include "slideshow/store_picture.h"
#include "slideshow/subfile_table.h"

using namespace pelo::slideshow;

int SlideShow::AddFile(const char* imagePath, const char* imageName, char imageFlag) {
  return store_picture(*this, {imagePath, nullptr, 0}, imageName, subfileCount, imageFlag);
}

int SlideShow::AddBuffer(void* data, int length, const char* imageName, char imageFlag) {
  return store_picture(*this, {nullptr, data, length}, imageName, subfileCount, imageFlag);
}

int SlideShow::InsertFile(const char* imagePath, const char* imageName, int position, char imageFlag) {
  if (!valid_index(*this, position)) return 0;
  return store_picture(*this, {imagePath, nullptr, 0}, imageName, position, imageFlag);
}

int SlideShow::InsertBuffer(void* data, int length, const char* imageName, int position,
                            char imageFlag) {
  if (!valid_index(*this, position)) return 0;
  return store_picture(*this, {nullptr, data, length}, imageName, position, imageFlag);
}

int SlideShow::AddImageToFile(const char* imagePath, const char* imageName) {
  return AddFile(imagePath, imageName, 1);
}

int SlideShow::AddImageToBuffer(void* data, int length, const char* imageName) {
  return AddBuffer(data, length, imageName, 1);
}

int SlideShow::InsertImageToFile(const char* imagePath, const char* imageName, int position) {
  return position == subfileCount ? AddFile(imagePath, imageName, 1)
                                  : InsertFile(imagePath, imageName, position, 1);
}

int SlideShow::InsertImageToBuffer(void* data, int length, const char* imageName, int position) {
  return position == subfileCount ? AddBuffer(data, length, imageName, 1)
                                  : InsertBuffer(data, length, imageName, position, 1);
}
