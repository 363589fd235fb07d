/* The flush that some managers export, as a module: a process that has not loaded it has no such
 * function. ExportedFlush loads it and sets the pointer. */

void tool_mm_flush(void);

void (*plexor_manager_flush)(void) = 0;

void tool_mm_flush(void) {
    if (plexor_manager_flush) plexor_manager_flush();
}
