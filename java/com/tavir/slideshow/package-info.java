/** Slide shows in one file, for applications on Android and on the desktop. */
package com.tavir.slideshow;
