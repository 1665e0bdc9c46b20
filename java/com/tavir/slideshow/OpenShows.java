package com.tavir.slideshow;

import java.util.TreeMap;

/**
 * The handles of the {@link SlideShow} objects.
 *
 * <p>The library takes handles below the number of open shows only. So that closing a show does not cut off
 * those opened after it, an empty show in memory keeps its place until they are closed as well.
 */
final class OpenShows {
    /** How many objects share a handle; 0 for a place that is only kept. */
    private static final TreeMap<Integer, Integer> USERS = new TreeMap<>();

    private OpenShows() {}

    static synchronized int create(String path) throws SlideShowException {
        return register(SlideShowJNI.CreateShow(path), path == null ? "create a show" : "create " + path);
    }

    static synchronized int open(String path) throws SlideShowException {
        return register(SlideShowJNI.OpenShow(path), "open " + path);
    }

    static synchronized void close(int handle) {
        int users = USERS.get(handle) - 1;
        if (users == 0 && handle < USERS.lastKey()) keepPlace(handle);
        USERS.put(handle, users);
        while (!USERS.isEmpty() && USERS.lastEntry().getValue() == 0) {
            SlideShowJNI.DeleteShow(USERS.pollLastEntry().getKey());
        }
    }

    private static int register(int handle, String request) throws SlideShowException {
        if (handle < 0) throw new SlideShowException(SlideShowException.Reason.of(handle), request);
        Integer users = USERS.get(handle);
        USERS.put(handle, users == null ? 1 : users + 1);
        return handle;
    }

    /** The first free place is the one that was freed: all others up to the last handle are taken. */
    private static void keepPlace(int handle) {
        SlideShowJNI.DeleteShow(handle);
        SlideShowJNI.CreateShow(null);
    }
}
