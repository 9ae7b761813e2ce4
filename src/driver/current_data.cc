#include "driver/current_data.h"

void select_current_data() {}
