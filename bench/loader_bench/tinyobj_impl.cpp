// The baseline OBJ reader of the benchmark, compiled once.
#define TINYOBJLOADER_IMPLEMENTATION
#include <tiny_obj_loader.h>
