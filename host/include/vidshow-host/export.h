#ifndef VIDSHOW_HOST_EXPORT_H
#define VIDSHOW_HOST_EXPORT_H

#define VIDSHOW_HOST_API __attribute__((visibility("default")))

#endif
