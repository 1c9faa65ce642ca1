// Nothing but the libraries of the command.
int main() { return 0; }
