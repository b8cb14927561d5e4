// Configure-time probe: can this machine run what the compiler builds?
int main() {
  return 0;
}
