#include "tests/folder_device/remote_api_table.h"
