#include "dataset/kal_dataset_component.h"

kal_dataset_component::kal_dataset_component(const std::string& dataset_path)
    : dataset_path(dataset_path) {}
